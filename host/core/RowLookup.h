#pragma once

#include "platform/host/Specifier.h"

#include <expected>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

namespace nimbra::host {

/// Why a row cannot be used the way that somebody asked for.
struct RowRefusal {
    enum class Reason {
        /// No row of the list has this identifier or name.
        noSuchRow,
        /// Several rows have this name.
        ambiguous,
        /// The row has nothing to read, such as a heading.
        noValue,
        /// Only a switch can be set.
        notASwitch,
        /// Only a button and a link can be tapped.
        notAButton,
        /// The page that the link leads to is not there.
        noPage,
        /// The row is shown, but cannot be used now.
        locked,
        /// The switch cannot be changed at all.
        noSetter,
        /// Nothing stands behind the button.
        noAction,
        /// Another screen or an alert stands over the list.
        covered,
    };

    Reason reason;
    /// The same in words, to be read behind a program's name: "no row "Foo" (rows: ...)".
    std::string explanation;
};

/// The row of `rows` that `name` stands for: the one with that identifier, or else the one with
/// that name as shown. A refusal names the rows that may have been meant, but never hundreds.
[[nodiscard]] std::expected<std::shared_ptr<Specifier>, RowRefusal>
findRow(const SpecifierArray& rows, std::string_view name);

/// That the rows can be read but not used while something stands over the list.
[[nodiscard]] RowRefusal refusalOfCoveredPage();
/// Why `row` has no value to read; nothing when it has one. Asks the getter.
[[nodiscard]] std::optional<RowRefusal> refusalToRead(const Specifier& row);
/// Why `row` cannot be tapped; nothing when it can, also where a link then opens no page.
[[nodiscard]] std::optional<RowRefusal> refusalToTap(const Specifier& row);
/// That the link `row` opens no page; nothing for one that does, and for a row of another kind.
[[nodiscard]] std::optional<RowRefusal> refusalToOpen(const Specifier& row);

/// Switches `row` on or off, unless that is refused.
[[nodiscard]] std::expected<void, RowRefusal> turnSwitch(Specifier& row, bool isOn);
/// Does what the button `row` is for, unless that is refused.
[[nodiscard]] std::expected<void, RowRefusal> pressButton(Specifier& row);

} // namespace nimbra::host

#pragma once

#include "platform/host/Specifier.h"
#include "platform/values/RowValue.h"
#include "platform/values/Text.h"

#include <nlohmann/json_fwd.hpp>
#include <optional>
#include <string>
#include <vector>

namespace nimbra::host {

enum class RowKind { group, switchRow, link, button };

/// "group", "switch", "link" or "button".
[[nodiscard]] std::string kindName(RowKind kind);

/// What there is to say of a row at one moment, for a reader as for a program. Asks the row's
/// getter once, when it is made; main queue.
struct RowDescription {
    RowKind kind;
    Text id;
    Text name;
    bool enabled;
    /// Nothing for a row without a getter.
    RowValue value;
    Text footer;
    /// The class of the view that stands under a group.
    Text footerClass;
    /// The application whose icon stands beside the row.
    Text icon;
    /// The class of the page that a link opens.
    std::optional<std::string> detail;

    [[nodiscard]] static RowDescription of(const Specifier& row);
    /// Without asking anybody: of a row whose page has gone.
    [[nodiscard]] static RowDescription withoutValue(const Specifier& row);
    [[nodiscard]] static std::vector<RowDescription> of(const SpecifierArray& rows);

    /// What the row is called: its identifier, or else its name.
    [[nodiscard]] const Text& label() const { return id ? id : name; }
    [[nodiscard]] nlohmann::ordered_json json() const;

    friend bool operator==(const RowDescription&, const RowDescription&) = default;
};

/// "on" or "off", a number, or the text; empty where there is nothing.
[[nodiscard]] std::string displayedValue(const RowValue& value);

[[nodiscard]] nlohmann::ordered_json jsonOf(const Text& text);
[[nodiscard]] nlohmann::ordered_json jsonOf(const RowValue& value);

} // namespace nimbra::host

#pragma once

#include "platform/apps/Entitlements.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::device {

/// What a freedesktop desktop entry says of an application.
///
/// What can be read of an entry is used, and what cannot is a problem. Beyond ten, problems are
/// counted only.
struct DesktopEntry {
    struct Problem {
        /// Where it stands, from 1.
        std::size_t line = 1;
        /// What is wrong, in one line.
        std::string what;

        friend bool operator==(const Problem&, const Problem&) = default;
    };

    /// Whether it describes an application at all, rather than a link or a directory.
    bool isApplication = false;
    /// The name in the best language that it has one in; nothing where there is none that is
    /// not blank.
    std::optional<std::string> name;
    /// The name or the path of its icon.
    std::optional<std::string> icon;
    /// Whether it stands for an application that was removed.
    bool isHidden = false;
    /// None where they cannot be read.
    Entitlements entitlements;
    /// In the order of their lines.
    std::vector<Problem> problems;

    /// Reads `text`, whatever bytes it is made of. `localeNames` are the user's languages as
    /// desktop entries call them, the best first.
    [[nodiscard]] static DesktopEntry read(std::string_view text,
                                           const std::vector<std::string>& localeNames);
};

} // namespace nimbra::device

#pragma once

#include "platform/values/Error.h"

#include <cstdint>
#include <expected>
#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra {

class View;

/// What of a view a constraint speaks of.
enum class LayoutAttribute : std::uint8_t { left, right, top, bottom, width, height, none };

[[nodiscard]] constexpr bool isHorizontal(LayoutAttribute attribute) {
    return attribute == LayoutAttribute::left || attribute == LayoutAttribute::right ||
           attribute == LayoutAttribute::width;
}

enum class LayoutRelation : std::uint8_t { lessThanOrEqual, equal, greaterThanOrEqual };

/// One rule of a layout: `firstItem.firstAttribute relation secondItem.secondAttribute + constant`.
/// The views are not owned; the view that a constraint is added to contains them.
struct LayoutConstraint {
    View* firstItem = nullptr;
    LayoutAttribute firstAttribute = LayoutAttribute::none;
    LayoutRelation relation = LayoutRelation::equal;
    /// Null, with the attribute none, for a rule against a number.
    View* secondItem = nullptr;
    LayoutAttribute secondAttribute = LayoutAttribute::none;
    double constant = 0;
    /// How hard the rule holds against others: 1000 means at any price.
    float priority = 1000;

    struct Format {
        /// Format options are a set of flags; 0, none, is the only one there is.
        unsigned options = 0;
        /// Numbers that the format calls by name.
        std::map<std::string, double> metrics;
        /// Views that the format calls by name; all in the same superview.
        std::map<std::string, View*> views;
    };

    /// The rules that a visual format stands for ("H:|-(margin)-[label]-|": across, from the
    /// superview's edge, by name and number). An error names the column, counted from 1, and what
    /// was expected there.
    [[nodiscard]] static std::expected<std::vector<LayoutConstraint>, Error>
    constraintsWithVisualFormat(std::string_view visualFormat, const Format& format);
};

} // namespace nimbra

#pragma once

#include "platform/values/Text.h"
#include "platform/views/AttributedString.h"
#include "platform/views/Font.h"
#include "platform/views/Geometry.h"

#include <nlohmann/json_fwd.hpp>
#include <optional>
#include <string>
#include <vector>

namespace nimbra {
class View;
class ViewController;
} // namespace nimbra

namespace nimbra::host {

/// What there is to say of one view at one moment.
struct ViewDescription {
    /// Its accessibility identifier; empty for none.
    std::string name;
    /// The platform's own class; "View" for any other.
    std::string className;
    Rect frame;
    double alpha = 1;
    bool hidden = false;
    /// Of a button.
    std::optional<bool> enabled;
    /// Of a spinner.
    std::optional<bool> animating;
    /// Of what shows a text: the text, how it is set where that is said for each stretch, and the
    /// view's own font.
    std::optional<Text> text;
    std::optional<AttributedString> styledText;
    std::optional<Font> font;

    [[nodiscard]] static ViewDescription of(const View& view);

    [[nodiscard]] nlohmann::ordered_json json() const;
};

/// What there is to say of a page with views of its own, for a reader as for a program. Main queue.
struct ScreenDescription {
    Text title;
    /// Of the bar's buttons: the title, "cancel" or "done" for a system item, absent for none.
    Text leftBarButton;
    Text rightBarButton;
    /// How large what can be scrolled to is; without a scroll view, the page itself.
    Size contentSize;
    /// In tree order, the root first.
    std::vector<ViewDescription> views;

    /// Of a page whose view is loaded.
    [[nodiscard]] static ScreenDescription of(ViewController& screen);
};

/// "thin", "light", "regular" or "bold".
[[nodiscard]] std::string nameOf(FontWeight weight);

} // namespace nimbra::host

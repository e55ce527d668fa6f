#include "host/core/ScreenDescription.h"

#include "host/core/RowDescription.h"
#include "platform/host/ViewController.h"
#include "platform/views/ActivityIndicatorView.h"
#include "platform/views/Button.h"
#include "platform/views/ImageView.h"
#include "platform/views/Label.h"
#include "platform/views/ScrollView.h"
#include "platform/views/Table.h"

#include <nlohmann/json.hpp>
#include <utility>

namespace nimbra::host {

namespace {

using Json = nlohmann::ordered_json;

Text titleOf(const std::optional<BarButtonItem>& item) {
    if (!item) {
        return {};
    }
    if (!item->systemItem) {
        return item->title;
    }
    return *item->systemItem == BarButtonSystemItem::cancel ? "cancel" : "done";
}

// NOLINTNEXTLINE(misc-no-recursion): a tree
void describe(const View& view, std::vector<ViewDescription>& views) {
    views.push_back(ViewDescription::of(view));
    for (const std::shared_ptr<View>& subview : view.subviews()) {
        describe(*subview, views);
    }
}

/// The runs as a trace tells them: of the attributes those that the texts of this platform vary.
Json runsJson(const AttributedString& text) {
    // A compact paragraph has nothing of its own between it and the next one.
    const auto isCompact = [](const TextAttributes& attributes) {
        return attributes.ParagraphStyleAttributeName.paragraphSpacing == 0;
    };
    auto runs = Json::array();
    for (const AttributedString::Run& run : text.runs()) {
        const bool isBold = run.attributes.FontAttributeName.weight == FontWeight::bold;
        runs.push_back(
            Json{{"text", run.text}, {"bold", isBold}, {"compact", isCompact(run.attributes)}});
    }
    return runs;
}

} // namespace

ViewDescription ViewDescription::of(const View& view) {
    ViewDescription description{.name = view.accessibilityIdentifier(),
                                .className = "View",
                                .frame = view.frame(),
                                .alpha = view.alpha(),
                                .hidden = view.isHidden()};
    if (const auto* label = dynamic_cast<const Label*>(&view)) {
        description.className = "Label";
        description.text = label->text();
        description.styledText = label->attributedText();
        description.font = label->font();
    } else if (const auto* button = dynamic_cast<const Button*>(&view)) {
        description.className = "Button";
        description.enabled = button->isEnabled();
        description.text = button->titleForState(ControlState::normal);
        description.font = button->titleLabel()->font();
    } else if (const auto* spinner = dynamic_cast<const ActivityIndicatorView*>(&view)) {
        description.className = "ActivityIndicatorView";
        description.animating = spinner->isAnimating();
    } else if (dynamic_cast<const ImageView*>(&view) != nullptr) {
        description.className = "ImageView";
    } else if (dynamic_cast<const ScrollView*>(&view) != nullptr) {
        description.className = "ScrollView";
    } else if (dynamic_cast<const Table*>(&view) != nullptr) {
        description.className = "Table";
    }
    return description;
}

Json ViewDescription::json() const {
    Json object{{"name", name.empty() ? Json() : Json(name)},
                {"class", className},
                {"frame", Json::array({frame.origin.x, frame.origin.y, frame.size.width,
                                       frame.size.height})},
                {"alpha", alpha},
                {"hidden", hidden}};
    if (enabled) {
        object["enabled"] = *enabled;
    }
    if (animating) {
        object["animating"] = *animating;
    }
    if (text) {
        object["text"] = jsonOf(*text);
    }
    if (styledText) {
        object["runs"] = runsJson(*styledText);
    }
    if (font) {
        object["font"] = Json{{"weight", nameOf(font->weight)}, {"size", font->pointSize}};
    }
    return object;
}

ScreenDescription ScreenDescription::of(ViewController& screen) {
    const View& root = *screen.view();
    const auto* scrollView = dynamic_cast<const ScrollView*>(&root);
    ScreenDescription description{
        .title = screen.title(),
        .leftBarButton = titleOf(screen.navigationItem().leftBarButtonItem()),
        .rightBarButton = titleOf(screen.navigationItem().rightBarButtonItem()),
        .contentSize = scrollView != nullptr ? scrollView->contentSize() : root.frame().size};
    describe(root, description.views);
    return description;
}

std::string nameOf(FontWeight weight) {
    switch (weight) {
    case FontWeight::thin:
        return "thin";
    case FontWeight::light:
        return "light";
    case FontWeight::regular:
        return "regular";
    case FontWeight::bold:
        return "bold";
    }
    return {};
}

} // namespace nimbra::host

#include "host/qt/DrawnViews.h"

#include "host/qt/Strings.h"
#include "host/qt/WindowMetrics.h"
#include "platform/views/ActivityIndicatorView.h"
#include "platform/views/Button.h"
#include "platform/views/ImageView.h"
#include "platform/views/Label.h"
#include "platform/views/ProgressView.h"
#include "platform/views/View.h"

#include <QFont>
#include <QRectF>
#include <algorithm>
#include <utility>

namespace nimbra::window {

namespace {

/// The text as the label shows it: a styled one says for itself how it is set.
AttributedString shownText(const Label& label) {
    return label.attributedText().value_or(AttributedString(
        label.text(), {.FontAttributeName = label.font(),
                       .ParagraphStyleAttributeName = {.alignment = label.textAlignment()}}));
}

} // namespace

DrawnViews::DrawnViews(Look look)
    : _metrics(look.metrics), _pictureUrl(std::move(look.pictureUrl)),
      _isMirrored(look.isMirrored) {}

int DrawnViews::rowCount(const QModelIndex& parent) const {
    return parent.isValid() ? 0 : static_cast<int>(_drawn.size());
}

QHash<int, QByteArray> DrawnViews::roleNames() const {
    return {{KindRole, "kind"},
            {FrameRole, "frame"},
            {TextRole, "text"},
            {PlainTextRole, "plainText"},
            {FontRole, "textFont"},
            {OpacityRole, "viewOpacity"},
            {IsEnabledRole, "isEnabled"},
            {ProgressRole, "progress"},
            {IsProgressAnimatedRole, "isProgressAnimated"},
            {IsTurningRole, "isTurning"},
            {SourceRole, "source"}};
}

QVariant DrawnViews::data(const QModelIndex& index, int role) const {
    return index.isValid() && index.row() < rowCount()
               ? _drawn.at(static_cast<std::size_t>(index.row())).values.value(role)
               : QVariant();
}

void DrawnViews::show(const View* root) {
    std::vector<Drawn> drawn;
    if (root != nullptr) {
        // The place of the root itself is the host's to choose.
        const Point& place = root->frame().origin;
        collect(*root, {.x = -place.x, .y = -place.y}, 1, drawn);
    }
    const bool areTheSame =
        std::ranges::equal(drawn, _drawn, [](const Drawn& left, const Drawn& right) {
            return left.view == right.view &&
                   left.values.value(KindRole) == right.values.value(KindRole);
        });
    if (!areTheSame) {
        beginResetModel();
        _drawn = std::move(drawn);
        endResetModel();
        return;
    }
    for (std::size_t place = 0; place < drawn.size(); ++place) {
        if (drawn[place] != _drawn[place]) {
            _drawn[place] = std::move(drawn[place]);
            const QModelIndex changed = index(static_cast<int>(place));
            Q_EMIT dataChanged(changed, changed);
        }
    }
}

// NOLINTNEXTLINE(misc-no-recursion): a tree
void DrawnViews::collect(const View& view, Point origin, double opacity,
                         std::vector<Drawn>& drawn) const {
    if (view.isHidden()) {
        return;
    }
    const Rect& frame = view.frame();
    origin = {.x = origin.x + frame.origin.x, .y = origin.y + frame.origin.y};
    opacity *= view.alpha();
    auto values = valuesOf(view);
    if (!values.isEmpty()) {
        values.insert(FrameRole, QRectF(origin.x, origin.y, frame.size.width, frame.size.height));
        values.insert(OpacityRole, opacity);
        drawn.push_back({.view = &view, .values = std::move(values)});
    }
    for (const auto& subview : view.subviews()) {
        collect(*subview, origin, opacity, drawn);
    }
}

QHash<int, QVariant> DrawnViews::valuesOf(const View& view) const {
    if (const auto* label = dynamic_cast<const Label*>(&view)) {
        const QString plain = qString(label->text());
        return {{KindRole, QStringLiteral("label")},
                {TextRole, _metrics.richText(shownText(*label), view.frame().size.width,
                                             label->numberOfLines(), _isMirrored)},
                {PlainTextRole, plain},
                {FontRole, _metrics.fontFor(label->font())}};
    }
    if (const auto* button = dynamic_cast<const Button*>(&view)) {
        const QString title = qString(button->titleForState(ControlState::normal));
        return {{KindRole, QStringLiteral("button")},
                {TextRole, title},
                {PlainTextRole, title},
                {FontRole, _metrics.fontFor(button->titleLabel()->font())},
                {IsEnabledRole, button->isEnabled() && button->isUserInteractionEnabled()}};
    }
    if (const auto* bar = dynamic_cast<const ProgressView*>(&view)) {
        return {{KindRole, QStringLiteral("bar")},
                {ProgressRole, bar->progress()},
                {IsProgressAnimatedRole, bar->isProgressAnimated()}};
    }
    if (const auto* spinner = dynamic_cast<const ActivityIndicatorView*>(&view)) {
        return {{KindRole, QStringLiteral("spinner")}, {IsTurningRole, spinner->isAnimating()}};
    }
    const auto* picture = dynamic_cast<const ImageView*>(&view);
    if (picture != nullptr && picture->image()) {
        return {{KindRole, QStringLiteral("picture")},
                {SourceRole, _pictureUrl(picture->image()->name.string())}};
    }
    return {};
}

} // namespace nimbra::window

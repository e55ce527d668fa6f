#include "platform/views/ProgressView.h"

#include "platform/views/ViewMetrics.h"

#include <algorithm>
#include <cmath>

namespace nimbra {

ProgressView::ProgressView(const PlatformServices& services, ProgressViewStyle style)
    : View(services, {}), _style(style) {}

void ProgressView::setProgressAnimated(float progress, bool animated) {
    _progress = std::isnan(progress) ? 0 : std::clamp(progress, 0.0F, 1.0F);
    _animated = animated;
}

Size ProgressView::intrinsicContentSize() const {
    return {.width = ViewNoIntrinsicMetric, .height = services().viewMetrics->progressBarHeight()};
}

} // namespace nimbra

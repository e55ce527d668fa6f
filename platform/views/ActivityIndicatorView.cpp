#include "platform/views/ActivityIndicatorView.h"

#include "platform/views/ViewMetrics.h"

namespace nimbra {

ActivityIndicatorView::ActivityIndicatorView(const PlatformServices& services,
                                             ActivityIndicatorViewStyle style)
    : View(services, {.origin = {}, .size = services.viewMetrics->activityIndicatorSize()}),
      _style(style) {}

Size ActivityIndicatorView::intrinsicContentSize() const {
    return services().viewMetrics->activityIndicatorSize();
}

} // namespace nimbra

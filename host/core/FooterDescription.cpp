#include "host/core/FooterDescription.h"

#include "platform/host/HeaderFooterView.h"
#include "platform/views/Label.h"
#include "platform/views/ProgressView.h"

#include <memory>

namespace nimbra::host {

namespace {

/// The first subview of this class; null where there is none.
template <class Kind>
std::shared_ptr<const Kind> firstOf(const View& view) {
    for (const auto& subview : view.subviews()) {
        if (auto found = std::dynamic_pointer_cast<const Kind>(subview)) {
            return found;
        }
    }
    return nullptr;
}

} // namespace

FooterDescription FooterDescription::of(const HeaderFooterView& footer) {
    FooterDescription description;
    if (const auto bar = firstOf<ProgressView>(footer)) {
        description.barHidden = bar->isHidden();
        description.barProgress = bar->progress();
        description.barHeight = bar->intrinsicContentSize().height;
    }
    if (const auto label = firstOf<Label>(footer)) {
        description.text = label->text();
        description.lineHeight = label->lineHeight();
    }
    description.height =
        footer.preferredHeightForWidthInTableView(footer.frame().size.width, nullptr);
    description.syncing = boolValue(footer.valueForKey(KeyPath("syncing")));
    description.timerRunning = boolValue(footer.valueForKey(KeyPath("lastSyncAutoUpdate")));
    description.subscribed = boolValue(footer.valueForKey(KeyPath("subscribed")));
    return description;
}

} // namespace nimbra::host

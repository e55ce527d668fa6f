#pragma once

#include "platform/values/FileURL.h"
#include "platform/values/Identifier.h"
#include "platform/views/View.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <utility>
#include <vector>

namespace nimbra {

/// Names a way to share something.
using ActivityType = Identifier<struct ActivityKind>;
inline const ActivityType ActivityTypeMessage{"ActivityTypeMessage"};
inline const ActivityType ActivityTypeMail{"ActivityTypeMail"};
/// To a device that is near.
inline const ActivityType ActivityTypeNearbyTransfer{"ActivityTypeNearbyTransfer"};

/// How the user left a share sheet.
enum class ShareOutcome : std::uint8_t { sent, cancelled, failed };

/// Where a sheet points to, on a screen that has room for more than the sheet.
struct PopoverPresentationController {
    /// Null where the sheet stands by itself.
    std::shared_ptr<View> sourceView;
};

/// Offers the user ways to share files. Main queue only.
class ShareSheet {
public:
    using CompletionHandler = std::function<void(ShareOutcome outcome)>;

    /// Made as a shared object, with what is to be shared.
    explicit ShareSheet(std::vector<FileURL> activityItems)
        : _activityItems(std::move(activityItems)) {}

    [[nodiscard]] const std::vector<FileURL>& activityItems() const { return _activityItems; }

    /// The only ways of sending that are offered, in this order; all that the host knows where none
    /// are set. To keep a copy on the device, or to note where the files are, is no activity: a
    /// host may offer that on any sheet.
    [[nodiscard]] const std::optional<std::vector<ActivityType>>& includedActivityTypes() const {
        return _includedActivityTypes;
    }
    void setIncludedActivityTypes(std::vector<ActivityType> types) {
        _includedActivityTypes = std::move(types);
    }

    /// What the host calls once, when the user has shared or given up. The sheet still stands then.
    [[nodiscard]] const CompletionHandler& completionWithItemsHandler() const {
        return _completionWithItemsHandler;
    }
    void setCompletionWithItemsHandler(CompletionHandler handler) {
        _completionWithItemsHandler = std::move(handler);
    }

    [[nodiscard]] PopoverPresentationController& popoverPresentationController() {
        return _popover;
    }

private:
    std::vector<FileURL> _activityItems;
    std::optional<std::vector<ActivityType>> _includedActivityTypes;
    CompletionHandler _completionWithItemsHandler;
    PopoverPresentationController _popover;
};

} // namespace nimbra

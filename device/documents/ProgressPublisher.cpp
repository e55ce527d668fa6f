#include "device/documents/ProgressPublisher.h"

#include "device/DeviceError.h"
#include "device/documents/DeviceProgress.h"
#include "device/documents/DeviceProgressReports.h"
#include "platform/system/WorkQueue.h"

#include <map>
#include <mutex>
#include <optional>
#include <utility>

namespace nimbra::device {

namespace {

/// A progress that is to be published.
struct Publication {
    std::string url;
    ProgressValues values;
    /// What came since.
    ProgressChanges changes;
};

/// All of one name: the progress that is shown, what waits for it, and the one that comes next.
struct Slot {
    std::shared_ptr<DeviceProgress> shown;
    ProgressChanges changes;
    /// Whether the one that is shown is to end.
    bool ends = false;
    std::optional<Publication> next;
    bool isWorkQueued = false;

    [[nodiscard]] bool isPublished() const { return next || (shown && !ends); }
    [[nodiscard]] bool hasWork() const { return ends || !changes.keys.empty() || next; }
};

std::unexpected<Error> notPublished(const std::string& id) {
    return std::unexpected(deviceError("no progress \"" + id + "\" is published"));
}

} // namespace

struct ProgressPublisher::State : std::enable_shared_from_this<State> {
    State(WorkQueue& queue, DeviceProgressReports& progressReports)
        : mainQueue(queue), reports(progressReports) {}

    WorkQueue& mainQueue;
    DeviceProgressReports& reports;
    std::mutex mutex;
    std::map<std::string, Slot> slots;

    /// With the lock held.
    void queueWork(const std::string& id, Slot& slot) {
        if (slot.isWorkQueued) {
            return;
        }
        slot.isWorkQueued = true;
        mainQueue.async([weakState = weak_from_this(), id] {
            if (const auto state = weakState.lock()) {
                state->work(id);
            }
        });
    }

    /// Tells what waits under the name `id`; on the main queue.
    void work(const std::string& id) {
        const auto [progress, changes, ends] = takeShown(id);
        if (progress) {
            progress->apply(changes);
        }
        if (ends) {
            reports.unpublish(progress);
        }
        if (const auto [published, url] = takeNext(id); published) {
            reports.publish(url, published);
        }
        finishWork(id);
    }

    struct TakenShown {
        std::shared_ptr<DeviceProgress> progress;
        ProgressChanges changes;
        bool ends = false;
    };
    struct TakenNext {
        std::shared_ptr<DeviceProgress> progress;
        std::string url;
    };

    TakenShown takeShown(const std::string& id) {
        const std::scoped_lock lock(mutex);
        Slot& slot = slots[id];
        TakenShown taken{.progress = slot.shown,
                         .changes = std::exchange(slot.changes, {}),
                         .ends = std::exchange(slot.ends, false)};
        if (taken.ends) {
            slot.shown = nullptr;
        }
        return taken;
    }

    TakenNext takeNext(const std::string& id) {
        const std::scoped_lock lock(mutex);
        Slot& slot = slots[id];
        // It may have come, behind an end, since the one that is shown was looked at.
        if (!slot.next || slot.shown) {
            return {};
        }
        Publication next = *std::exchange(slot.next, std::nullopt);
        slot.shown = std::make_shared<DeviceProgress>(std::move(next.values));
        // These wait for a piece of work behind those that publish it to its subscribers.
        slot.changes = std::move(next.changes);
        return {slot.shown, std::move(next.url)};
    }

    void finishWork(const std::string& id) {
        const std::scoped_lock lock(mutex);
        Slot& slot = slots[id];
        slot.isWorkQueued = false;
        if (slot.hasWork()) {
            queueWork(id, slot);
        } else if (!slot.shown) {
            slots.erase(id);
        }
    }
};

ProgressPublisher::ProgressPublisher(WorkQueue& mainQueue, DeviceProgressReports& reports)
    : _state(std::make_shared<State>(mainQueue, reports)) {}

ProgressPublisher::~ProgressPublisher() = default;

std::expected<void, Error> ProgressPublisher::publish(const std::string& id, const std::string& url,
                                                      ProgressValues values) {
    const std::scoped_lock lock(_state->mutex);
    Slot& slot = _state->slots[id];
    if (slot.isPublished()) {
        return std::unexpected(deviceError("a progress \"" + id + "\" is published already"));
    }
    slot.next = Publication{.url = url, .values = std::move(values), .changes = {}};
    _state->queueWork(id, slot);
    return {};
}

std::expected<void, Error> ProgressPublisher::update(const std::string& id,
                                                     const ProgressChanges& changes) {
    const std::scoped_lock lock(_state->mutex);
    const auto entry = _state->slots.find(id);
    if (entry == _state->slots.end() || !entry->second.isPublished()) {
        return notPublished(id);
    }
    Slot& slot = entry->second;
    (slot.next ? slot.next->changes : slot.changes).merge(changes);
    if (slot.hasWork()) {
        _state->queueWork(id, slot);
    }
    return {};
}

std::expected<void, Error> ProgressPublisher::unpublish(const std::string& id) {
    const std::scoped_lock lock(_state->mutex);
    const auto entry = _state->slots.find(id);
    if (entry == _state->slots.end() || !entry->second.isPublished()) {
        return notPublished(id);
    }
    Slot& slot = entry->second;
    if (slot.next) {
        slot.next.reset();
    } else {
        slot.ends = true;
        _state->queueWork(id, slot);
    }
    return {};
}

} // namespace nimbra::device

#pragma once

#include "platform/host/HeaderFooterView.h"
#include "platform/values/Date.h"

#include <atomic>
#include <memory>
#include <mutex>
#include <optional>

namespace nimbra {

class Label;
class ObserverToken;
class ProgressReport;
class ProgressSubscriber;
class ProgressView;
class Specifier;
class TimerEventSource;

/// What stands under the master switch: a bar and a text while something is synced, the sentence
/// of the last sync otherwise. It follows the sync while it is in a window.
///
/// Main queue only; the three properties that say so may be read on any thread. The handlers of its
/// timer, of its subscription and of its notifications hold the view: it lives until the services
/// that it is registered with let go of them.
class RSPNimbraDriveProgressFooterView final : public HeaderFooterView {
public:
    /// The view with its subviews, its constraints and its timer. The services outlive it.
    [[nodiscard]] static std::shared_ptr<RSPNimbraDriveProgressFooterView>
    initWithFrame(const Rect& frame, const PlatformServices& services);
    /// The same without a size. The group does not matter to it.
    [[nodiscard]] static std::shared_ptr<RSPNimbraDriveProgressFooterView>
    initWithSpecifier(const Specifier& group, const PlatformServices& services);

    ~RSPNimbraDriveProgressFooterView() override;

    /// Stands for the subscription; null while there is none. Any thread.
    [[nodiscard]] std::shared_ptr<ProgressSubscriber> globalProgressSubscriber() const;
    /// Stands for the latest registration for news of the last sync. Any thread.
    [[nodiscard]] std::shared_ptr<ObserverToken> lastSyncDateSubscriber() const;
    /// Whether a progress of the whole sync is published. Any thread.
    [[nodiscard]] bool isSyncing() const { return _syncing; }

    [[nodiscard]] const std::shared_ptr<ProgressView>& progressBar() const { return _progressBar; }
    [[nodiscard]] const std::shared_ptr<Label>& statusLabel() const { return _statusLabel; }

    void willMoveToWindow(Window* window) override;
    void observeValueForKeyPath(const KeyPath& keyPath, const Observation& observation) override;
    /// No width of its own; one line of text, the bar and the gap between them are its height.
    [[nodiscard]] Size intrinsicContentSize() const override;
    /// The same height in every width.
    [[nodiscard]] double preferredHeightForWidthInTableView(double width,
                                                            const Table* table) const override;
    /// Knows "syncing", "lastSyncAutoUpdate" and "subscribed", all boolean.
    [[nodiscard]] RowValue valueForKey(const KeyPath& key) const override;

private:
    struct Key {};

public:
    /// For `initWithFrame`, which alone has the key.
    RSPNimbraDriveProgressFooterView(Key key, const Rect& frame, const PlatformServices& services);

private:
    void createTimer();
    void createSubviews();
    void createConstraints();

    void setGlobalProgressSubscriber(std::shared_ptr<ProgressSubscriber> subscriber);
    void setLastSyncDateSubscriber(std::shared_ptr<ObserverToken> token);

    void readLastSyncDate();
    void observeLastSync();
    void subscribeToProgress();
    void beginShowing(const std::shared_ptr<ProgressReport>& progress);
    void endShowing(ProgressReport& progress);
    void show(const ProgressReport& progress);

    void _updateLocalizedLastSync();
    void _updateLocalizedLastSyncAndScheduleAutoUpdateWithDate(const std::optional<Date>& date);

    [[nodiscard]] std::shared_ptr<RSPNimbraDriveProgressFooterView> sharedFromThis();

    mutable std::mutex _tokens;
    std::shared_ptr<ProgressSubscriber> _globalProgressSubscriber;
    std::shared_ptr<ObserverToken> _lastSyncDateSubscriber;
    std::atomic<bool> _syncing = false;
    bool _lastSyncAutoUpdate = false;
    std::shared_ptr<TimerEventSource> _lastSyncSource;
    std::shared_ptr<ProgressView> _progressBar;
    std::shared_ptr<Label> _statusLabel;
};

} // namespace nimbra

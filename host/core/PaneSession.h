#pragma once

#include "device/system/CurrentQueue.h"
#include "host/core/AccountPage.h"
#include "host/core/DetailPage.h"
#include "host/core/FixedViewMetrics.h"
#include "host/core/GroupFooters.h"
#include "host/core/HostLoop.h"
#include "host/core/ListWatcher.h"
#include "host/core/Presentations.h"
#include "host/core/RowLookup.h"
#include "platform/host/Presenter.h"
#include "platform/host/SettingsListController.h"
#include "platform/values/Error.h"
#include "platform/views/ViewAnimations.h"

#include <atomic>
#include <expected>
#include <filesystem>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace nimbra {
struct Notification;
class SettingsRootController;
} // namespace nimbra
namespace nimbra::device {
class DeviceBundle;
class DevicePlatform;
class TimeSource;
} // namespace nimbra::device

namespace nimbra::host {

class SessionTracer;
class Trace;

/// A device in use, and the pane that is open on it: what the user of a host does, without the
/// host's looks. It runs on the thread that makes it, which is the main queue's while it lives.
class PaneSession final : private Presenter {
public:
    struct Configuration {
        /// The device directory.
        std::filesystem::path root;
        /// The folder of the pane's bundle; nothing for the one that `findPaneBundle` finds.
        std::optional<std::filesystem::path> bundle;
        /// Shows everything in this locale instead of the device's.
        std::optional<std::string> locale;
        /// Gets all that the pane does; null for no trace. Not owned, outlives the session.
        Trace* trace = nullptr;
        /// What the device takes its time from; null for the machine's time.
        std::shared_ptr<device::TimeSource> timeSource;
        /// Whether the device's log stays in its own file, as that of a device that is soon gone.
        bool keepsLogToItself = false;
        /// How large what the host draws comes out; null for a host without a screen. Not owned,
        /// outlives the session.
        ViewMetrics* viewMetrics = nullptr;
    };

    /// Starts using the device. An error names the file that cannot be used.
    [[nodiscard]] static std::expected<std::unique_ptr<PaneSession>, Error>
    start(Configuration configuration);

    PaneSession(const PaneSession&) = delete;
    PaneSession& operator=(const PaneSession&) = delete;
    /// Closes the pane and waits for what it has set going.
    ~PaneSession() override;

    [[nodiscard]] HostLoop& loop() { return _loop; }
    [[nodiscard]] device::DevicePlatform& device() { return *_device; }
    /// The device directory.
    [[nodiscard]] const std::filesystem::path& root() const { return _configuration.root; }

    /// Runs the main queue until nothing is left to do anywhere, a layout included. A timer that
    /// runs is nothing to do until it falls due.
    void settle();
    /// Runs the work that is queued now, and lays out what asks for it.
    void runPending();
    /// Whether nothing is left to do anywhere, as after `settle`. Who runs the main queue with
    /// `runPending`, whenever the loop's `wakeUpDescriptor` is readable, asks afterwards: the last
    /// background work to end wakes it up as well. Any thread.
    [[nodiscard]] bool isSettled() const;

    /// Uses `texts` as the pane's own string table in every language, from now on.
    void replaceTexts(std::map<std::string, std::string> texts);

    /// Makes the page of the account from which the pane is opened; no pane is open before. An
    /// error names what is missing.
    [[nodiscard]] std::expected<void, Error> openAccountPage(const PaneEntry& entry);
    /// The page of the account; null where neither it nor the pane has been opened, and after the
    /// pane has been closed.
    [[nodiscard]] const std::shared_ptr<AccountPage>& accountPage() const { return _accountPage; }

    /// Opens the pane from the row of the account's page: it has its view and its rows then. No
    /// pane is open before. An error names what is missing.
    [[nodiscard]] std::expected<void, Error> openPane(const PaneEntry& entry);
    [[nodiscard]] bool isPaneOpen() const { return _pane != nullptr; }
    /// Dismisses the open pane, which disappears first if it is shown, and lets it go.
    void closePane();

    /// Sets who is told of each change of the pane's list, also of panes that are opened later;
    /// null for nobody. Not owned: to be taken back before it goes.
    void setListObserver(SettingsListObserver* observer);
    /// Lays the list out `width` points wide from the next layout on; a phone's width to begin
    /// with.
    void setListWidth(double width) { _listWidth = width; }
    /// Asks `isShown` whether the user sees a row of the pane's list now: only then has its table a
    /// cell for it. Empty for a host that shows all rows at once, as one is to begin with. Called
    /// on the main queue while a pane is open.
    void setRowVisibility(std::function<bool(const Specifier& row)> isShown) {
        _isRowShown = std::move(isShown);
    }

    /// What the pane is busy with, as it says; absent while it is not.
    [[nodiscard]] const Text& activity() const { return _activity; }
    /// Calls `observer` on the main queue each time the pane becomes busy or ends being it.
    void setActivityObserver(std::function<void()> observer);

    // What happens to an open pane.

    void appear();
    void disappear();
    void pullToRefresh();
    /// Whether a pull is still being answered.
    [[nodiscard]] bool isRefreshing();
    [[nodiscard]] std::string paneTitle() const;
    [[nodiscard]] const SpecifierArray& rows();
    /// The views under the groups of the list; they follow it when the main queue runs, right after
    /// the piece of work that has changed it.
    [[nodiscard]] GroupFooters& footers() { return *_footers; }
    /// What the pane has presented over itself; it is laid out whenever the main queue runs.
    [[nodiscard]] Presentations& presentations() { return _presentations; }
    /// What a link row of the pane has opened. The user comes back from it when a row of the pane
    /// is set or tapped, and when the pane closes.
    [[nodiscard]] DetailPage& detailPage() { return _detailPage; }
    /// The row that `name` stands for.
    [[nodiscard]] std::expected<std::shared_ptr<Specifier>, RowRefusal> row(std::string_view name);
    [[nodiscard]] std::expected<void, RowRefusal> setRow(std::string_view name, bool isOn);
    [[nodiscard]] std::expected<void, RowRefusal> setRow(const std::shared_ptr<Specifier>& row,
                                                         bool isOn);
    /// Presses a button row, or opens the page of a link row; one without a page opens nothing.
    [[nodiscard]] std::expected<void, RowRefusal> tapRow(std::string_view name);
    [[nodiscard]] std::expected<void, RowRefusal> tapRow(const std::shared_ptr<Specifier>& row);

    // What happens on the device, pane or no pane.

    /// Tells the pane, and whoever else listens, that the host application came to the front.
    void becomeActive();
    /// Posts within this process, on the calling thread; any thread.
    void post(const Notification& notification);
    /// Posts to every process of the device; any thread.
    void postDistributed(const Notification& notification);

private:
    explicit PaneSession(Configuration configuration);

    void showActivityInProgress(const Text& message) override;
    void hideActivityInProgress() override;
    void reloadParentSpecifier() override;
    void reloadAllParentSpecifiers() override;
    void dismissPresentedController(bool animated) override;
    void presentController(const std::shared_ptr<SetupController>& controller,
                           bool animated) override;
    void dismissController(const ViewController& controller, bool animated) override;
    void presentAlert(const std::shared_ptr<AlertController>& alert, bool animated) override;
    void showAccountAlert(const std::shared_ptr<AccountAlertView>& alert) override;
    void presentShareSheet(const std::shared_ptr<ShareSheet>& sheet, bool animated) override;

    /// Comes back from a page behind a link to the rows, where the user can reach them now.
    [[nodiscard]] std::expected<void, RowRefusal> uncoverRows();
    void openDetail(const std::shared_ptr<Specifier>& row);
    void setActivity(Text activity);
    void updateFootersSoon();
    void updateFooters();
    void layOut();
    [[nodiscard]] std::expected<void, Error> loadBundle();
    [[nodiscard]] PlatformServices servicesForPane();
    /// The cell of the row at `path`; null for a row that is not shown. A page that has been closed
    /// shows none.
    [[nodiscard]] std::shared_ptr<TableCell> cellOfRow(const IndexPath& path);
    [[nodiscard]] std::expected<UserInfo, Error> userInfoFor(const PaneEntry& entry);

    Configuration _configuration;
    HostLoop _loop;
    device::CurrentQueueScope _scope;
    FixedViewMetrics _fixedViewMetrics;
    ViewAnimations _viewAnimations;
    /// The device's own services, not traced.
    std::optional<PlatformServices> _services;
    /// Stays until the device has ended: what a view asks of a service last may still be traced.
    std::unique_ptr<SessionTracer> _tracer;
    std::unique_ptr<device::DevicePlatform> _device;
    std::shared_ptr<device::DeviceBundle> _bundle;
    std::optional<std::map<std::string, std::string>> _texts;
    std::shared_ptr<SettingsRootController> _rootController;
    std::shared_ptr<AccountPage> _accountPage;
    std::shared_ptr<SettingsListController> _pane;
    ListWatcher _listWatcher;
    /// What a terminal shows has no width in points: this is a phone's.
    double _listWidth = 390;
    std::function<bool(const Specifier& row)> _isRowShown;
    std::unique_ptr<GroupFooters> _footers;
    Presentations _presentations;
    DetailPage _detailPage;
    /// Set on any thread: on the one that posts, a notification can make the list anew.
    std::atomic<bool> _areFootersBehind = false;
    bool _isShown = false;
    Text _activity;
    std::function<void()> _activityObserver;
};

} // namespace nimbra::host

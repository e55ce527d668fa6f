#pragma once

#include "platform/host/SettingsRootController.h"
#include "platform/host/ShareSheet.h"
#include "tests/pane/PaneFixture.h"

#include <cstdint>
#include <memory>
#include <string>
#include <utility>

namespace nimbra::test {
inline constexpr const char* kArchive = "/var/mobile/Library/Logs/CrashReporter/DiagnosticLogs/"
                                        "Stratafile/stratafile-Phone-yy.MM.dd-HH.mm.ss@0.tar.gz";

inline const std::string kShared =
    std::string("share, animated: ") + kArchive +
    " ActivityTypeMessage ActivityTypeMail ActivityTypeNearbyTransfer, "
    "handled";

/// Notes the tasks in the list of all calls.
class RecordingRoot final : public SettingsRootController {
public:
    explicit RecordingRoot(Calls& calls) : _calls(calls) {}

    void addTask(const std::shared_ptr<const Controller>& controller) override {
        SettingsRootController::addTask(controller);
        _calls.emplace_back("task added");
    }
    void taskFinished(const std::shared_ptr<const Controller>& controller) override {
        SettingsRootController::taskFinished(controller);
        _calls.emplace_back("task finished");
    }

private:
    Calls& _calls;
};

/// The pane with diagnostics, under a root controller.
struct DiagnosticsFixture : PaneFixture {
    DiagnosticsFixture() {
        storeTidewater(true);
        setLogLevel(7);
        pane->setRootController(root);
        pane->loadViewIfNeeded();
    }
    ~DiagnosticsFixture() override {
        // As a host does at its end: the sheet's handler holds the page.
        platform.presenter.shareSheet.reset();
    }
    DiagnosticsFixture(const DiagnosticsFixture&) = delete;
    DiagnosticsFixture& operator=(const DiagnosticsFixture&) = delete;

    void setLogLevel(std::int64_t level) {
        platform.preferences.integers[{"com.vantrel.marrow", "log.level"}] = level;
    }
    [[nodiscard]] std::shared_ptr<Specifier> button() const { return pane->specifiers().at(4); }
    void tap() const { button()->performButtonAction(); }
    void collect() { platform.workQueues.globalQueueWithQuality(UserInitiatedQuality).pump(); }
    void pumpMain() { platform.workQueues.mainQueue().pump(); }
    void tapAndWait() {
        tap();
        collect();
        pumpMain();
    }
    [[nodiscard]] Calls takeCalls() { return std::exchange(platform.calls, {}); }
    /// What was called, without what the tool's run does to files and processes.
    [[nodiscard]] Calls takeHostCalls() {
        Calls host;
        for (const std::string& call : takeCalls()) {
            if (!call.starts_with("remove ") && !call.starts_with("create ") &&
                !call.starts_with("spawn ") && !call.starts_with("wait ")) {
                host.push_back(call);
            }
        }
        return host;
    }
    [[nodiscard]] std::shared_ptr<ShareSheet> sheet() const {
        return platform.presenter.shareSheet;
    }

    std::shared_ptr<RecordingRoot> root = std::make_shared<RecordingRoot>(platform.calls);
};

} // namespace nimbra::test

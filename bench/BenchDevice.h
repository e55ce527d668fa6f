#pragma once

#include "device/DeviceDescription.h"
#include "device/DevicePlatform.h"
#include "host/core/FixedViewMetrics.h"
#include "host/core/HostLoop.h"
#include "host/core/scenario/TemporaryDirectory.h"
#include "platform/host/Presenter.h"
#include "platform/host/SettingsListController.h"
#include "platform/views/ViewAnimations.h"

#include <cstddef>
#include <filesystem>
#include <memory>

namespace nimbra {
struct ControllerClass;
}

namespace nimbra::bench {

/// A device with one account, its cloud documents on, in a directory of its own: real stores, real
/// queues. Throws `std::runtime_error` when it cannot be made.
class BenchDevice final : private Presenter {
public:
    /// With so many applications, of which every second has consent records of both services and
    /// the others of cloud documents alone.
    explicit BenchDevice(std::size_t applications = 0);

    /// Such a device, for whoever makes one elsewhere.
    [[nodiscard]] static device::DeviceDescription describe(std::size_t applications);

    /// Ends the platform and opens it again: it knows nothing that it has read before.
    void reopen();

    [[nodiscard]] device::DevicePlatform& platform() { return *_platform; }
    [[nodiscard]] PlatformServices services() {
        return _platform->servicesFor({*this, _viewMetrics, _viewAnimations});
    }
    /// The same, but with other bundles, which are not owned.
    [[nodiscard]] PlatformServices servicesWith(Bundles& bundles);

    /// Loads the bundle as it was built, so that its texts and images are found.
    void loadBundle();

    /// Runs what is queued on the main queue, and what that queues in turn.
    void runMainQueue() {
        while (_loop.runPending()) {
        }
    }

    /// The folder of the pane's bundle as it was built.
    [[nodiscard]] static std::filesystem::path builtBundle();
    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    /// An empty place for a benchmark's own files.
    [[nodiscard]] std::filesystem::path scratch() const { return _directory.path(); }

    /// The rows of a pane of this class, opened on the device's account.
    [[nodiscard]] static std::size_t rowsOfNewPane(const ControllerClass& paneClass,
                                                   const PlatformServices& services);
    template <class Pane>
    [[nodiscard]] static std::size_t rowsOfNewPane(const PlatformServices& services) {
        return rowsOf(*std::make_shared<Pane>(services));
    }

private:
    [[nodiscard]] static std::size_t rowsOf(SettingsListController& pane);

    void showActivityInProgress(const Text& /*message*/) override {}
    void hideActivityInProgress() override {}
    void reloadParentSpecifier() override {}
    void reloadAllParentSpecifiers() override {}
    void dismissPresentedController(bool /*animated*/) override {}
    void presentController(const std::shared_ptr<SetupController>& /*controller*/,
                           bool /*animated*/) override {}
    void dismissController(const ViewController& /*controller*/, bool /*animated*/) override {}
    void presentAlert(const std::shared_ptr<AlertController>& /*alert*/,
                      bool /*animated*/) override {}
    void showAccountAlert(const std::shared_ptr<AccountAlertView>& /*alert*/) override {}
    void presentShareSheet(const std::shared_ptr<ShareSheet>& /*sheet*/,
                           bool /*animated*/) override {}

    host::TemporaryDirectory _directory;
    host::HostLoop _loop;
    host::FixedViewMetrics _viewMetrics;
    ViewAnimations _viewAnimations;
    std::unique_ptr<device::DevicePlatform> _platform;
};

} // namespace nimbra::bench

#include "bench/BenchDevice.h"

#include "device/DeviceDirectory.h"
#include "platform/accounts/Dataclass.h"
#include "platform/system/ClassRegistry.h"

#include <stdexcept>
#include <type_traits>
#include <utility>

namespace nimbra::bench {

namespace {

constexpr const char* deviceFolder = "device";

template <class T>
T valueOf(std::expected<T, Error> result) {
    if (!result) {
        throw std::runtime_error(result.error().line());
    }
    if constexpr (!std::is_void_v<T>) {
        return std::move(*result);
    }
}

} // namespace

BenchDevice::BenchDevice() : _directory(valueOf(host::TemporaryDirectory::make())) {
    const std::filesystem::path root = _directory.path() / deviceFolder;
    device::DeviceDescription description;
    description.accounts.at(0).enabled = {kAccountDataclassTidewater.string()};
    valueOf(device::createDeviceDirectory(root, description));
    _platform = valueOf(device::DevicePlatform::open(root, _loop));
}

PlatformServices BenchDevice::servicesWith(Bundles& bundles) {
    const PlatformServices own = services();
    return {.presenter = own.presenter,
            .accountStore = own.accountStore,
            .documentContainers = own.documentContainers,
            .notificationCenter = own.notificationCenter,
            .workQueues = own.workQueues,
            .fileManager = own.fileManager,
            .bundles = bundles,
            .localization = own.localization,
            .deviceInfo = own.deviceInfo,
            .restrictions = own.restrictions,
            .systemLog = own.systemLog};
}

std::filesystem::path BenchDevice::builtBundle() {
    return NIMBRA_BUNDLE;
}

std::filesystem::path BenchDevice::accountsDatabase() const {
    return _directory.path() / deviceFolder / "var/lib/nimbra/accounts.db";
}

std::size_t BenchDevice::rowsOfNewPane(const ControllerClass& paneClass,
                                       const PlatformServices& services) {
    const auto entry =
        Specifier::preferenceSpecifierNamed("Nimbra Drive", {.cell = CellType::LinkListCell});
    entry->setUserInfo({{FirstSetupKey, false}, {AccountIdentifierKey, Text("primary")}});
    const std::shared_ptr<SettingsListController> pane = paneClass.create(services);
    pane->setSpecifier(entry);
    pane->viewDidLoad();
    return pane->specifiers().size();
}

} // namespace nimbra::bench

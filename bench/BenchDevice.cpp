#include "bench/BenchDevice.h"

#include "bench/MemoryServices.h"
#include "bench/ValueOf.h"
#include "device/DeviceDirectory.h"
#include "device/bundles/DeviceBundle.h"
#include "device/bundles/DeviceBundles.h"
#include "platform/accounts/Dataclass.h"
#include "platform/privacy/PrivacyConsentStore.h"
#include "platform/system/ClassRegistry.h"

namespace nimbra::bench {

BenchDevice::BenchDevice(std::size_t applications)
    : _directory(valueOf(host::TemporaryDirectory::make())) {
    valueOf(device::createDeviceDirectory(root(), describe(applications)));
    reopen();
}

device::DeviceDescription BenchDevice::describe(std::size_t applications) {
    device::DeviceDescription description;
    description.accounts.at(0).enabled = {kAccountDataclassTidewater.string()};
    for (std::size_t index = 0; index < applications; ++index) {
        const std::string identifier = applicationIdentifier(index);
        description.apps.push_back({.identifier = identifier, .name = applicationName(index)});
        description.consent.push_back(
            {.service = kPRVServiceTidewater.string(), .bundle = identifier, .granted = true});
        if (index % 2 == 0) {
            description.consent.push_back({.service = kPRVServiceBrackwater.string(),
                                           .bundle = identifier,
                                           .granted = false});
        }
    }
    return description;
}

void BenchDevice::reopen() {
    _platform.reset();
    _platform = valueOf(device::DevicePlatform::open(root(), _loop, {}));
}

void BenchDevice::loadBundle() {
    static_cast<void>(valueOf(_platform->bundles().load(builtBundle())));
}

PlatformServices BenchDevice::servicesWith(Bundles& bundles) {
    PlatformServices services = this->services();
    services.bundles = bundles;
    return services;
}

std::filesystem::path BenchDevice::builtBundle() {
    return NIMBRA_BUNDLE;
}

std::size_t BenchDevice::rowsOfNewPane(const ControllerClass& paneClass,
                                       const PlatformServices& services) {
    return rowsOf(*paneClass.create(services));
}

std::size_t BenchDevice::rowsOf(SettingsListController& pane) {
    const auto entry =
        Specifier::preferenceSpecifierNamed("Nimbra Drive", {.cell = CellType::LinkListCell});
    entry->setUserInfo({{FirstSetupKey, false}, {AccountIdentifierKey, Text("primary")}});
    pane.setSpecifier(entry);
    pane.loadViewIfNeeded();
    return pane.specifiers().size();
}

} // namespace nimbra::bench

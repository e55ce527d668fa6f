#include "bench/MemoryServices.h"

#include "device/store/ConsentBundle.h"

#include <utility>

namespace nimbra::bench {

namespace {

class MemoryApp final : public AppProxy {
public:
    explicit MemoryApp(Text name) : _name(std::move(name)) {}

    [[nodiscard]] bool isRemovedSystemApp() const override { return false; }
    [[nodiscard]] const Entitlements& entitlements() const override { return _entitlements; }
    [[nodiscard]] Text localizedName() const override { return _name; }

private:
    Text _name;
    Entitlements _entitlements;
};

} // namespace

std::string applicationIdentifier(std::size_t index) {
    return "com.example.application-" + std::to_string(index);
}

std::string applicationName(std::size_t index) {
    constexpr std::size_t stride = 7919;
    constexpr std::size_t names = 100003;
    return "Application " + std::to_string(index * stride % names);
}

MemoryServices::MemoryServices(std::size_t applications, const PlatformServices& others)
    : _others(others) {
    for (std::size_t index = 0; index < applications; ++index) {
        const BundleIdentifier identifier(applicationIdentifier(index));
        const auto bundle = std::make_shared<device::ConsentBundle>(identifier);
        _tidewater.push_back({.kPRVInfoBundle = bundle, .kPRVInfoGranted = true});
        if (index % 2 == 0) {
            _brackwater.push_back({.kPRVInfoBundle = bundle, .kPRVInfoGranted = false});
        }
        _apps.emplace(identifier, std::make_shared<MemoryApp>(applicationName(index)));
    }
}

PlatformServices MemoryServices::services() {
    PlatformServices services = _others;
    services.localization = *this;
    services.restrictions = *this;
    services.privacyConsentStore = *this;
    services.applications = *this;
    return services;
}

std::optional<PrivacyAccessRecords>
MemoryServices::PRVAccessCopyInformation(const PrivacyService& service) {
    return service == kPRVServiceTidewater ? _tidewater : _brackwater;
}

bool MemoryServices::PRVAccessSetForBundle(const PrivacyService& /*service*/,
                                           const Bundle* /*bundle*/, bool /*granted*/) {
    return false;
}

std::shared_ptr<const AppProxy>
MemoryServices::applicationProxyForIdentifier(const BundleIdentifier& identifier) {
    const auto app = _apps.find(identifier);
    return app != _apps.end() ? app->second : nullptr;
}

Locale MemoryServices::currentLocale() const {
    return _others.localization->currentLocale();
}

Text MemoryServices::stringWithFormatLocaleArguments(
    const Text& format, const Locale& locale, std::span<const FormatArgument> arguments) const {
    return _others.localization->stringWithFormatLocaleArguments(format, locale, arguments);
}

int MemoryServices::localizedStandardCompare(const Text& left, const Text& right) const {
    return left.string().compare(right.string());
}

std::unique_ptr<DateFormatter> MemoryServices::dateFormatterWithFormat(const Text& format) const {
    return _others.localization->dateFormatterWithFormat(format);
}

} // namespace nimbra::bench

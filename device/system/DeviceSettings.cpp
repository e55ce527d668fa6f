#include "device/system/DeviceSettings.h"

#include "device/description/DescriptionFiles.h"
#include "device/files/DevicePaths.h"

#include <atomic>
#include <mutex>
#include <optional>
#include <utility>

namespace nimbra::device {

struct DeviceSettings::State {
    DevicePaths paths;
    mutable std::mutex mutex;
    std::string name;
    std::string locale;
    std::string timeZone;
    bool hasCellularData = false;
    std::optional<std::string> wirelessVariant;
    UserInterfaceIdiom idiom = UserInterfaceIdiom::phone;
    std::optional<Screen> screen;
    std::optional<std::string> overridingLocale;
    std::atomic<std::uint64_t> localeRevision = 1;
};

DeviceSettings::DeviceSettings(std::shared_ptr<State> state) : _state(std::move(state)) {}

std::expected<DeviceSettings, Error> DeviceSettings::open(const std::filesystem::path& root) {
    DeviceSettings settings(std::make_shared<State>(DevicePaths(root)));
    if (const auto read = settings.reload(); !read) {
        return std::unexpected(read.error());
    }
    return settings;
}

std::string DeviceSettings::name() const {
    const std::scoped_lock lock(_state->mutex);
    return _state->name;
}

std::string DeviceSettings::localeIdentifier() const {
    const std::scoped_lock lock(_state->mutex);
    return _state->overridingLocale.value_or(_state->locale);
}

std::uint64_t DeviceSettings::localeRevision() const {
    return _state->localeRevision.load(std::memory_order_acquire);
}

std::string DeviceSettings::timeZone() const {
    const std::scoped_lock lock(_state->mutex);
    return _state->timeZone;
}

bool DeviceSettings::hasCellularData() const {
    const std::scoped_lock lock(_state->mutex);
    return _state->hasCellularData;
}

std::optional<std::string> DeviceSettings::wirelessVariant() const {
    const std::scoped_lock lock(_state->mutex);
    return _state->wirelessVariant;
}

UserInterfaceIdiom DeviceSettings::userInterfaceIdiom() const {
    const std::scoped_lock lock(_state->mutex);
    return _state->idiom;
}

std::optional<Screen> DeviceSettings::mainScreen() const {
    const std::scoped_lock lock(_state->mutex);
    return _state->screen;
}

void DeviceSettings::overrideLocale(const std::string& identifier) {
    const std::scoped_lock lock(_state->mutex);
    _state->overridingLocale = identifier;
    ++_state->localeRevision;
}

std::expected<void, Error> DeviceSettings::reload() {
    auto description = readDescriptionFile(_state->paths, deviceFile);
    if (!description) {
        return std::unexpected(description.error());
    }
    const std::scoped_lock lock(_state->mutex);
    _state->name = std::move(description->name);
    _state->locale = std::move(description->locale);
    ++_state->localeRevision;
    _state->timeZone = std::move(description->timeZone);
    _state->hasCellularData = description->cellularData;
    _state->wirelessVariant = std::move(description->wirelessVariant);
    _state->idiom =
        description->idiom == "pad" ? UserInterfaceIdiom::pad : UserInterfaceIdiom::phone;
    _state->screen.reset();
    if (const auto& screen = description->screen) {
        _state->screen = {.bounds = {.origin = {}, .size = {screen->width, screen->height}},
                          .scale = screen->scale};
    }
    return {};
}

} // namespace nimbra::device

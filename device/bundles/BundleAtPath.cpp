#include "device/bundles/BundleAtPath.h"

#include "device/DeviceError.h"
#include "device/bundles/DeviceBundle.h"
#include "device/bundles/DeviceBundles.h"
#include "platform/system/SystemLog.h"

#include <utility>

namespace nimbra::device {

BundleAtPath::BundleAtPath(Text path, std::filesystem::path folder, DeviceBundles& bundles,
                           SystemLog& log)
    : _path(std::move(path)), _folder(std::move(folder)), _bundles(bundles), _log(log) {}

std::shared_ptr<DeviceBundle> BundleAtPath::loadedBundle() const {
    return _bundles.bundleLoadedFrom(_folder);
}

const std::optional<BundleIdentifier>& BundleAtPath::identifier() const {
    static const std::optional<BundleIdentifier> none;
    // A bundle that is loaded is kept by those that loaded it.
    const auto loaded = loadedBundle();
    return loaded ? loaded->identifier() : none;
}

Text BundleAtPath::localizedStringForKeyValueTable(const Text& key, const Text& value,
                                                   const Text& table) const {
    const auto loaded = loadedBundle();
    return loaded ? loaded->localizedStringForKeyValueTable(key, value, table) : value;
}

std::shared_ptr<const Image> BundleAtPath::imageNamed(const Text& name) const {
    const auto loaded = loadedBundle();
    return loaded ? loaded->imageNamed(name) : nullptr;
}

bool BundleAtPath::isLoaded() const {
    return loadedBundle() != nullptr;
}

std::expected<void, Error> BundleAtPath::load() {
    const auto loaded = _bundles.loadClasses(_folder);
    if (loaded) {
        return {};
    }
    // Where the device's directory stands on this machine concerns no page and no log of it.
    Error failure = withPath(loaded.error(), _folder, _path.string());
    _log.write(LogLevel::error, "Can't load bundle: " + failure.description);
    return std::unexpected(std::move(failure));
}

} // namespace nimbra::device

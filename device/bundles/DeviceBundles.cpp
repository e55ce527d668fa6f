#include "device/bundles/DeviceBundles.h"

#include "device/DeviceError.h"
#include "device/bundles/BundleAtPath.h"
#include "device/bundles/BundleCode.h"
#include "device/bundles/BundleImages.h"
#include "device/bundles/DeviceBundle.h"
#include "device/bundles/Manifest.h"
#include "device/bundles/StringTables.h"
#include "platform/system/ClassRegistry.h"

#include <algorithm>
#include <dlfcn.h>
#include <system_error>
#include <utility>

namespace nimbra::device {

namespace {

/// What the log calls the bundle at `path`, which without links is `folder`: the path that it has
/// on the device, where it is of the device.
std::string nameInLog(const DevicePaths& paths, const std::filesystem::path& path,
                      const std::filesystem::path& folder) {
    std::error_code failure;
    const auto below = folder.lexically_relative(std::filesystem::canonical(paths.root(), failure));
    const bool isOnDevice = !failure && !below.empty() && *below.begin() != "..";
    return isOnDevice ? '/' + below.string() : path.string();
}

} // namespace

DeviceBundles::DeviceBundles(DevicePaths paths, const DeviceSettings& settings,
                             ClassRegistry& classes, SystemLog& log)
    : _paths(std::move(paths)), _settings(settings), _classes(classes), _log(log) {}

DeviceBundles::~DeviceBundles() = default;

std::shared_ptr<Bundle>
DeviceBundles::bundleWithIdentifier(const BundleIdentifier& identifier) const {
    const std::scoped_lock lock(_mutex);
    if (_unfindable.contains(identifier)) {
        return nullptr;
    }
    const auto entry = std::ranges::find_if(_bundles, [&identifier](const auto& bundle) {
        return bundle.second->identifier() == identifier;
    });
    return entry != _bundles.end() ? entry->second : nullptr;
}

std::shared_ptr<Bundle> DeviceBundles::bundleWithPath(const Text& path) {
    if (path.string().empty()) {
        return nullptr;
    }
    const auto resolved = _paths.resolve(path.string());
    std::error_code failure;
    const std::filesystem::path folder =
        resolved ? std::filesystem::weakly_canonical(*resolved, failure) : std::filesystem::path();
    if (folder.empty() || failure) {
        return nullptr;
    }
    if (auto loaded = bundleLoadedFrom(folder)) {
        return loaded;
    }
    return std::filesystem::is_directory(folder, failure)
               ? std::make_shared<BundleAtPath>(path, folder, *this, _log)
               : nullptr;
}

std::shared_ptr<DeviceBundle>
DeviceBundles::bundleLoadedFrom(const std::filesystem::path& folder) const {
    const std::scoped_lock lock(_mutex);
    const auto loaded = _bundles.find(folder);
    return loaded != _bundles.end() ? loaded->second : nullptr;
}

std::shared_ptr<Bundle> DeviceBundles::bundleForClass(const std::type_info& classType) const {
    Dl_info object{};
    if (::dladdr(&classType, &object) == 0 || object.dli_fname == nullptr) {
        return nullptr;
    }
    std::error_code failure;
    const std::filesystem::path folder =
        std::filesystem::canonical(std::filesystem::path(object.dli_fname).parent_path(), failure);
    return failure ? nullptr : bundleLoadedFrom(folder);
}

std::expected<std::shared_ptr<DeviceBundle>, Error>
DeviceBundles::load(const std::filesystem::path& path) {
    return load(path, FirstClass::needed);
}

std::expected<std::shared_ptr<DeviceBundle>, Error>
DeviceBundles::loadClasses(const std::filesystem::path& path) {
    return load(path, FirstClass::notNeeded);
}

std::expected<std::shared_ptr<DeviceBundle>, Error>
DeviceBundles::load(const std::filesystem::path& path, FirstClass firstClass) {
    std::error_code failure;
    const std::filesystem::path folder = std::filesystem::canonical(path, failure);
    if (!failure && !std::filesystem::is_directory(folder, failure) && !failure) {
        failure = std::make_error_code(std::errc::not_a_directory);
    }
    if (failure) {
        return std::unexpected(fileError(path, "is not a bundle", failure.value()));
    }
    if (auto loaded = bundleLoadedFrom(folder)) {
        if (firstClass == FirstClass::needed && !loaded->hasPrincipalClass()) {
            return std::unexpected(
                deviceError(path.string() + ": its first class was not there when it was loaded"));
        }
        return loaded;
    }
    auto manifest = Manifest::read(path);
    if (!manifest) {
        return std::unexpected(manifest.error());
    }
    auto tables = LanguageTables::read(path);
    if (!tables) {
        return std::unexpected(tables.error());
    }
    if (auto registered = registerClasses(path, *manifest, firstClass); !registered) {
        return std::unexpected(std::move(registered.error()));
    }
    auto bundle = std::make_shared<DeviceBundle>(DeviceBundle::Parts{
        .identifier = std::move(manifest->identifier),
        .developmentLanguage = std::move(manifest->developmentLanguage),
        .tables = std::move(*tables),
        .images = BundleImages::read(path, nameInLog(_paths, path, folder), _log),
        .principalClass = _classes.classNamed(manifest->principalClass.value_or("")),
        .settings = &_settings});
    const std::scoped_lock lock(_mutex);
    _bundles.emplace(folder, bundle);
    return bundle;
}

void DeviceBundles::setFindable(const BundleIdentifier& identifier, bool findable) {
    const std::scoped_lock lock(_mutex);
    if (findable) {
        _unfindable.erase(identifier);
    } else {
        _unfindable.insert(identifier);
    }
}

std::expected<void, Error> DeviceBundles::registerClasses(const std::filesystem::path& path,
                                                          const Manifest& manifest,
                                                          FirstClass firstClass) {
    const std::filesystem::path executable = path / manifest.executable;
    auto classes = classesIn(executable);
    if (!classes) {
        return std::unexpected(std::move(classes.error()));
    }
    if (firstClass == FirstClass::needed) {
        if (!manifest.principalClass) {
            return std::unexpected(
                deviceError((path / "manifest.json").string() + ": names no principalClass"));
        }
        if (classes->classNamed(*manifest.principalClass) == nullptr) {
            return std::unexpected(deviceError(executable.string() + ": registers no class named " +
                                               *manifest.principalClass +
                                               ", the manifest's principalClass"));
        }
    }
    if (!_classes.takeClassesOf(*classes)) {
        return std::unexpected(
            deviceError(executable.string() + ": the name of one of its classes is taken"));
    }
    return {};
}

} // namespace nimbra::device

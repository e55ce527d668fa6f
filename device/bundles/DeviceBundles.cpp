#include "device/bundles/DeviceBundles.h"

#include "device/DeviceError.h"
#include "device/bundles/BundleImages.h"
#include "device/bundles/DeviceBundle.h"
#include "device/bundles/Manifest.h"
#include "device/bundles/StringTables.h"
#include "platform/system/ClassRegistry.h"

#include <algorithm>
#include <cerrno>
#include <dlfcn.h>
#include <system_error>
#include <utility>

namespace nimbra::device {

namespace {

std::string linkerError() {
    const char* const message = ::dlerror();
    return message != nullptr ? message : "unknown reason";
}

/// The function under which the shared object at `path` registers its classes. The object stays
/// loaded: rows and classes point into it for as long as the process runs.
std::expected<BundleEntryPoint*, Error> entryPoint(const std::filesystem::path& path) {
    std::error_code failure;
    if (!std::filesystem::exists(path, failure)) {
        return std::unexpected(fileError(path, "the bundle's shared object cannot be loaded",
                                         failure ? failure.value() : ENOENT));
    }
    // The linker keeps the path as it is given, for whoever asks later where a class comes from.
    void* const object =
        ::dlopen(std::filesystem::absolute(path, failure).c_str(), RTLD_NOW | RTLD_LOCAL);
    if (object == nullptr) {
        return std::unexpected(deviceError(
            path.string() + ": the bundle's shared object cannot be loaded: " + linkerError()));
    }
    void* const symbol = ::dlsym(object, kBundleEntryPoint);
    if (symbol == nullptr) {
        return std::unexpected(deviceError(path.string() +
                                           ": the bundle's shared object lacks its entry point " +
                                           kBundleEntryPoint));
    }
    // NOLINTNEXTLINE(cppcoreguidelines-pro-type-reinterpret-cast): dlsym knows objects only
    return reinterpret_cast<BundleEntryPoint*>(symbol);
}

} // namespace

DeviceBundles::DeviceBundles(const DeviceSettings& settings, ClassRegistry& classes, SystemLog& log)
    : _settings(settings), _classes(classes), _log(log) {}

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

std::shared_ptr<Bundle> DeviceBundles::bundleForClass(const std::type_info& classType) const {
    Dl_info object{};
    if (::dladdr(&classType, &object) == 0 || object.dli_fname == nullptr) {
        return nullptr;
    }
    std::error_code failure;
    const std::filesystem::path folder =
        std::filesystem::canonical(std::filesystem::path(object.dli_fname).parent_path(), failure);
    const std::scoped_lock lock(_mutex);
    const auto loaded = failure ? _bundles.end() : _bundles.find(folder);
    return loaded != _bundles.end() ? loaded->second : nullptr;
}

std::expected<std::shared_ptr<DeviceBundle>, Error>
DeviceBundles::load(const std::filesystem::path& path) {
    std::error_code failure;
    const std::filesystem::path folder = std::filesystem::canonical(path, failure);
    if (!failure && !std::filesystem::is_directory(folder, failure) && !failure) {
        failure = std::make_error_code(std::errc::not_a_directory);
    }
    if (failure) {
        return std::unexpected(fileError(path, "is not a bundle", failure.value()));
    }
    {
        const std::scoped_lock lock(_mutex);
        if (const auto loaded = _bundles.find(folder); loaded != _bundles.end()) {
            return loaded->second;
        }
    }
    auto manifest = Manifest::read(path);
    if (!manifest) {
        return std::unexpected(manifest.error());
    }
    auto tables = LanguageTables::read(path);
    if (!tables) {
        return std::unexpected(tables.error());
    }
    const auto principalClass =
        registerClasses(path / manifest->executable, manifest->principalClass);
    if (!principalClass) {
        return std::unexpected(principalClass.error());
    }
    auto bundle = std::make_shared<DeviceBundle>(
        DeviceBundle::Parts{.identifier = std::move(manifest->identifier),
                            .developmentLanguage = std::move(manifest->developmentLanguage),
                            .tables = std::move(*tables),
                            .images = BundleImages::read(path, _log),
                            .principalClass = *principalClass,
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

std::expected<const ControllerClass*, Error>
DeviceBundles::registerClasses(const std::filesystem::path& executable,
                               const std::string& principalClass) {
    const auto registerBundle = entryPoint(executable);
    if (!registerBundle) {
        return std::unexpected(registerBundle.error());
    }
    if (!(*registerBundle)(_classes)) {
        return std::unexpected(
            deviceError(executable.string() + ": the name of one of its classes is taken"));
    }
    const ControllerClass* const first = _classes.classNamed(principalClass);
    if (first == nullptr) {
        return std::unexpected(deviceError(executable.string() + ": registers no class named " +
                                           principalClass + ", the manifest's principalClass"));
    }
    return first;
}

} // namespace nimbra::device

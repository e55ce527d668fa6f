#include "device/bundles/BundleCode.h"

#include "device/DeviceError.h"
#include "device/bundles/ObjectFile.h"

#include <dlfcn.h>
#include <exception>
#include <string>
#include <string_view>
#include <system_error>
#include <utility>

namespace nimbra::device {

namespace {

constexpr const char* cannotBeLoaded = "the bundle's shared object cannot be loaded";

/// What the linker says of the object at `path`, which it may name once more.
std::string linkerError(const std::filesystem::path& path) {
    const char* const message = ::dlerror();
    std::string_view reason = message != nullptr ? message : "unknown reason";
    if (const std::string name = path.string() + ": "; reason.starts_with(name)) {
        reason.remove_prefix(name.size());
    }
    return oneLine(reason);
}

/// The function under which the shared object at `path` registers its classes.
std::expected<BundleEntryPoint*, Error> entryPoint(const std::filesystem::path& path) {
    if (auto checked = checkObjectFile(path, cannotBeLoaded); !checked) {
        return std::unexpected(std::move(checked.error()));
    }
    std::error_code failure;
    // The linker keeps the path as it is given, for whoever asks later where a class comes from.
    const std::filesystem::path absolute = std::filesystem::absolute(path, failure);
    void* const object = ::dlopen(absolute.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (object == nullptr) {
        return std::unexpected(
            deviceError(path.string() + ": " + cannotBeLoaded + ": " + linkerError(absolute)));
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

std::unexpected<Error> thrown(const std::filesystem::path& path, std::string_view what) {
    return std::unexpected(
        deviceError(path.string() + ": its entry point has thrown" + oneLine(what)));
}

} // namespace

std::expected<ClassRegistry, Error> classesIn(const std::filesystem::path& path) {
    const auto registerClasses = entryPoint(path);
    if (!registerClasses) {
        return std::unexpected(registerClasses.error());
    }
    // A registry of its own: of an object that fails half-way nothing is left behind.
    ClassRegistry classes;
    try {
        if (!(*registerClasses)(classes)) {
            return std::unexpected(
                deviceError(path.string() + ": the name of one of its classes is taken"));
        }
    } catch (const std::exception& exception) {
        return thrown(path, std::string(": ") + exception.what());
    } catch (...) {
        return thrown(path, "");
    }
    return classes;
}

} // namespace nimbra::device

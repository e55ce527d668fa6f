#pragma once

#include "device/files/DevicePaths.h"
#include "platform/system/Bundles.h"
#include "platform/values/Error.h"

#include <cstdint>
#include <expected>
#include <filesystem>
#include <map>
#include <memory>
#include <mutex>
#include <set>

namespace nimbra {
class ClassRegistry;
class SystemLog;
} // namespace nimbra

namespace nimbra::device {

class DeviceBundle;
class DeviceSettings;
struct Manifest;

/// The bundles that this process has loaded. Loading is for the main queue, looking up for any.
class DeviceBundles final : public Bundles {
public:
    /// Texts are looked up in the language of `settings`; bundles register their classes with
    /// `classes`; `log` is told of images that cannot be read, and of a bundle that was found at
    /// its path on the device but cannot be loaded. None is owned; all outlive the bundles.
    DeviceBundles(DevicePaths paths, const DeviceSettings& settings, ClassRegistry& classes,
                  SystemLog& log);
    ~DeviceBundles() override;

    [[nodiscard]] std::shared_ptr<Bundle>
    bundleWithIdentifier(const BundleIdentifier& identifier) const override;
    // Whether a bundle is findable makes no difference to these.

    [[nodiscard]] std::shared_ptr<Bundle> bundleWithPath(const Text& path) override;
    [[nodiscard]] std::shared_ptr<Bundle>
    bundleForClass(const std::type_info& classType) const override;

    /// Loads the bundle in the folder `path`: its manifest, its string tables, the sizes of its
    /// images, its shared object with dlopen, which stays loaded for the life of the process, and
    /// registers its classes, the one that the manifest calls its first among them. An error names
    /// the file and what was expected of it; none of the classes is registered then.
    /// A folder that is loaded already gives the bundle that was made of it, if that has its first
    /// class.
    [[nodiscard]] std::expected<std::shared_ptr<DeviceBundle>, Error>
    load(const std::filesystem::path& path);
    /// The same for a bundle that needs no first class: its classes are found by their names.
    [[nodiscard]] std::expected<std::shared_ptr<DeviceBundle>, Error>
    loadClasses(const std::filesystem::path& path);

    /// The bundle that was loaded from `folder`, a path without links; null for none. Any thread.
    [[nodiscard]] std::shared_ptr<DeviceBundle>
    bundleLoadedFrom(const std::filesystem::path& folder) const;

    /// Whether `bundleWithIdentifier` finds the bundle called `identifier` once it is loaded, as
    /// it does until this says otherwise.
    void setFindable(const BundleIdentifier& identifier, bool findable);

private:
    /// Whether the bundle has to have a first class.
    enum class FirstClass : std::uint8_t { needed, notNeeded };

    [[nodiscard]] std::expected<std::shared_ptr<DeviceBundle>, Error>
    load(const std::filesystem::path& path, FirstClass firstClass);
    [[nodiscard]] std::expected<void, Error> registerClasses(const std::filesystem::path& path,
                                                             const Manifest& manifest,
                                                             FirstClass firstClass);

    const DevicePaths _paths;
    const DeviceSettings& _settings;
    ClassRegistry& _classes;
    SystemLog& _log;
    mutable std::mutex _mutex;
    /// By the folder's path without links.
    std::map<std::filesystem::path, std::shared_ptr<DeviceBundle>> _bundles;
    std::set<BundleIdentifier> _unfindable;
};

} // namespace nimbra::device

#pragma once

#include "platform/system/Bundles.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <map>
#include <memory>
#include <mutex>
#include <set>
#include <string>

namespace nimbra {
class ClassRegistry;
class SystemLog;
struct ControllerClass;
} // namespace nimbra

namespace nimbra::device {

class DeviceBundle;
class DeviceSettings;

/// The bundles that this process has loaded. Loading is for the main queue, looking up for any.
class DeviceBundles final : public Bundles {
public:
    /// Texts are looked up in the language of `settings`; bundles register their classes with
    /// `classes`; `log` is told of images that cannot be read. None is owned; all outlive the
    /// bundles.
    DeviceBundles(const DeviceSettings& settings, ClassRegistry& classes, SystemLog& log);
    ~DeviceBundles() override;

    [[nodiscard]] std::shared_ptr<Bundle>
    bundleWithIdentifier(const BundleIdentifier& identifier) const override;
    /// Whether the bundle is findable makes no difference here.
    [[nodiscard]] std::shared_ptr<Bundle>
    bundleForClass(const std::type_info& classType) const override;

    /// Loads the bundle in the folder `path`: its manifest, its string tables, the sizes of its
    /// images, its shared object with dlopen, which stays loaded for the life of the process, and
    /// registers its classes. An error names the file and what was expected of it.
    /// A folder that is loaded already gives the bundle that was made of it.
    [[nodiscard]] std::expected<std::shared_ptr<DeviceBundle>, Error>
    load(const std::filesystem::path& path);

    /// Whether `bundleWithIdentifier` finds the bundle called `identifier` once it is loaded, as
    /// it does until this says otherwise.
    void setFindable(const BundleIdentifier& identifier, bool findable);

private:
    [[nodiscard]] std::expected<const ControllerClass*, Error>
    registerClasses(const std::filesystem::path& executable, const std::string& principalClass);

    const DeviceSettings& _settings;
    ClassRegistry& _classes;
    SystemLog& _log;
    mutable std::mutex _mutex;
    /// By the folder's path without links.
    std::map<std::filesystem::path, std::shared_ptr<DeviceBundle>> _bundles;
    std::set<BundleIdentifier> _unfindable;
};

} // namespace nimbra::device

#pragma once

#include <functional>
#include <map>
#include <memory>
#include <string>

namespace nimbra {

class SettingsListController;
struct PlatformServices;

/// A controller class that can be found by its name, as long as the process runs.
struct ControllerClass {
    std::string name;
    /// Makes a controller over the given services, which outlive it.
    std::function<std::shared_ptr<SettingsListController>(const PlatformServices&)> create;
};

/// The classes that loaded bundles have registered. Main queue only.
class ClassRegistry {
public:
    /// Takes a class; false, and nothing changed, when its name is taken.
    [[nodiscard]] bool registerClass(ControllerClass controllerClass);

    /// The class called `name`, owned by the registry; null when no loaded bundle has it.
    [[nodiscard]] const ControllerClass* classNamed(const std::string& name) const;

private:
    std::map<std::string, ControllerClass> _classes;
};

/// What a bundle's shared object exports under `kBundleEntryPoint`, with C linkage: it registers
/// the bundle's classes, and says false when one of their names is taken.
using BundleEntryPoint = bool(ClassRegistry& classes);
inline constexpr const char* kBundleEntryPoint = "NimbraBundleRegisterClasses";

} // namespace nimbra

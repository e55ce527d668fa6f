#pragma once

#include "platform/values/RowValue.h"

#include <functional>
#include <map>
#include <memory>
#include <string>

namespace nimbra {

class HeaderFooterView;
class SettingsListController;
class Specifier;
struct PlatformServices;

/// A controller class that can be found by its name, as long as the process runs.
struct ControllerClass {
    std::string name;
    /// Makes a controller over the given services, which outlive it.
    std::function<std::shared_ptr<SettingsListController>(const PlatformServices&)> create;
    /// What the class itself answers, without an object of it, by the operation's name: for
    /// example "tessaryNumAppGroups", a number. Called on the main queue each time somebody asks.
    std::map<std::string, std::function<RowValue()>> classOperations;
};

/// A class of views above or under a group's rows, which the group names.
struct HeaderFooterClass {
    std::string name;
    /// Makes the view for `group`, over services that outlive it.
    std::function<std::shared_ptr<HeaderFooterView>(const Specifier& group,
                                                    const PlatformServices&)>
        initWithSpecifier;
};

/// The classes that loaded bundles have registered. Main queue only.
class ClassRegistry {
public:
    /// Takes a class; false, and nothing changed, when its name is taken.
    [[nodiscard]] bool registerClass(ControllerClass controllerClass);

    /// The class called `name`, owned by the registry; null when no loaded bundle has it.
    [[nodiscard]] const ControllerClass* classNamed(const std::string& name) const;

    /// The same for classes of views above or under a group's rows.
    [[nodiscard]] bool registerHeaderFooterClass(HeaderFooterClass headerFooterClass);
    [[nodiscard]] const HeaderFooterClass* headerFooterClassNamed(const std::string& name) const;

    /// Takes all classes of `others`, which stay where they are in memory and are `others`' no
    /// more; false, and nothing changed, when a name of one of them is taken.
    [[nodiscard]] bool takeClassesOf(ClassRegistry& others);

private:
    std::map<std::string, ControllerClass> _classes;
    std::map<std::string, HeaderFooterClass> _headerFooterClasses;
};

/// What a bundle's shared object exports under `kBundleEntryPoint`, with C linkage: it registers
/// the bundle's classes, and says false when one of their names is taken.
using BundleEntryPoint = bool(ClassRegistry& classes);
inline constexpr const char* kBundleEntryPoint = "NimbraBundleRegisterClasses";

} // namespace nimbra

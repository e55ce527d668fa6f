#include "platform/system/ClassRegistry.h"

#include <utility>

namespace nimbra {

bool ClassRegistry::registerClass(ControllerClass controllerClass) {
    std::string name = controllerClass.name;
    return _classes.emplace(std::move(name), std::move(controllerClass)).second;
}

const ControllerClass* ClassRegistry::classNamed(const std::string& name) const {
    const auto entry = _classes.find(name);
    return entry != _classes.end() ? &entry->second : nullptr;
}

} // namespace nimbra

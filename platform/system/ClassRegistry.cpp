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

bool ClassRegistry::registerHeaderFooterClass(HeaderFooterClass headerFooterClass) {
    std::string name = headerFooterClass.name;
    return _headerFooterClasses.emplace(std::move(name), std::move(headerFooterClass)).second;
}

const HeaderFooterClass* ClassRegistry::headerFooterClassNamed(const std::string& name) const {
    const auto entry = _headerFooterClasses.find(name);
    return entry != _headerFooterClasses.end() ? &entry->second : nullptr;
}

} // namespace nimbra

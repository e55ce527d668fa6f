#include "platform/system/ClassRegistry.h"

#include <algorithm>
#include <utility>

namespace nimbra {

namespace {

template <class Classes>
bool shareAName(const Classes& some, const Classes& others) {
    return std::ranges::any_of(some,
                               [&others](const auto& one) { return others.contains(one.first); });
}

} // namespace

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

bool ClassRegistry::takeClassesOf(ClassRegistry& others) {
    if (shareAName(others._classes, _classes) ||
        shareAName(others._headerFooterClasses, _headerFooterClasses)) {
        return false;
    }
    _classes.merge(others._classes);
    _headerFooterClasses.merge(others._headerFooterClasses);
    return true;
}

} // namespace nimbra

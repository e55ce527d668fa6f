// A bundle's shared object whose entry point throws after it has registered the database's page.

#include "platform/system/ClassRegistry.h"

#include <stdexcept>

extern "C" nimbra::BundleEntryPoint NimbraBundleRegisterClasses;

bool NimbraBundleRegisterClasses(nimbra::ClassRegistry& classes) {
    static_cast<void>(classes.registerClass({.name = "TSYSettingsController"}));
    throw std::runtime_error("not today");
}

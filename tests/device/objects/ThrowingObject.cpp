// A bundle's shared object whose entry point registers a class and then throws what the build says.

#include "platform/system/ClassRegistry.h"

#include <stdexcept>

extern "C" nimbra::BundleEntryPoint NimbraBundleRegisterClasses;

bool NimbraBundleRegisterClasses(nimbra::ClassRegistry& classes) {
    static_cast<void>(classes.registerClass({.name = "FirstController"}));
    throw NIMBRA_TEST_THROWN;
}

// A bundle's shared object that registers one class, whose name the build gives.

#include "platform/host/SettingsListController.h"
#include "platform/system/ClassRegistry.h"

#include <memory>

extern "C" nimbra::BundleEntryPoint NimbraBundleRegisterClasses;

bool NimbraBundleRegisterClasses(nimbra::ClassRegistry& classes) {
    return classes.registerClass({.name = NIMBRA_TEST_CLASS, .create = [](const auto&) {
                                      return std::shared_ptr<nimbra::SettingsListController>();
                                  }});
}

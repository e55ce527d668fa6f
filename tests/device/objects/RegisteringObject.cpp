// A bundle's shared object that registers one class of its own, whose name the build gives.

#include "platform/host/SettingsListController.h"
#include "platform/system/ClassRegistry.h"

#include <memory>

extern "C" nimbra::BundleEntryPoint NimbraBundleRegisterClasses;

namespace {

class Controller final : public nimbra::SettingsListController {
public:
    using SettingsListController::SettingsListController;

    [[nodiscard]] const nimbra::SpecifierArray& specifiers() override { return _none; }

private:
    nimbra::SpecifierArray _none;
};

} // namespace

bool NimbraBundleRegisterClasses(nimbra::ClassRegistry& classes) {
    return classes.registerClass({.name = NIMBRA_TEST_CLASS, .create = [](const auto& services) {
                                      return std::make_shared<Controller>(services);
                                  }});
}

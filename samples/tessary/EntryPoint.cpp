#include "platform/system/ClassRegistry.h"
#include "samples/tessary/AppGroups.h"
#include "samples/tessary/TSYSettingsController.h"

#include <memory>

extern "C" nimbra::BundleEntryPoint NimbraBundleRegisterClasses;

bool NimbraBundleRegisterClasses(nimbra::ClassRegistry& classes) {
    const auto create = [](const nimbra::PlatformServices& services) {
        return std::make_shared<nimbra::samples::TSYSettingsController>(services);
    };
    const auto count = [] {
        const auto number = nimbra::samples::numberOfAppGroups();
        return number ? nimbra::RowValue(*number) : nimbra::RowValue();
    };
    return classes.registerClass({.name = "TSYSettingsController",
                                  .create = create,
                                  .classOperations = {{"tessaryNumAppGroups", count}}});
}

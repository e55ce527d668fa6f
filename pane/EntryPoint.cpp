#include "footer/RSPNimbraDriveProgressFooterView.h"
#include "pane/RSPNimbraDriveViewController.h"
#include "platform/system/ClassRegistry.h"

#include <memory>

extern "C" nimbra::BundleEntryPoint NimbraBundleRegisterClasses;

bool NimbraBundleRegisterClasses(nimbra::ClassRegistry& classes) {
    const auto create = [](const nimbra::PlatformServices& services) {
        return std::make_shared<nimbra::RSPNimbraDriveViewController>(services);
    };
    return classes.registerClass({.name = "RSPNimbraDriveViewController", .create = create}) &&
           classes.registerHeaderFooterClass(
               {.name = "RSPNimbraDriveProgressFooterView",
                .initWithSpecifier = nimbra::RSPNimbraDriveProgressFooterView::initWithSpecifier});
}

#include "footer/RSPNimbraDriveProgressFooterView.h"
#include "pane/RSPNimbraDriveViewController.h"
#include "platform/host/Specifier.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>

extern "C" nimbra::BundleEntryPoint NimbraBundleRegisterClasses;

namespace nimbra::test {
namespace {

struct EntryPoint : testing::Test {
    TestPlatform platform;
};

TEST_F(EntryPoint, RegistersThePageUnderItsName) {
    ASSERT_TRUE(NimbraBundleRegisterClasses(platform.classes));

    const ControllerClass* page = platform.classes.classNamed("RSPNimbraDriveViewController");
    ASSERT_NE(page, nullptr);
    const PlatformServices services = platform.services();
    EXPECT_NE(std::dynamic_pointer_cast<RSPNimbraDriveViewController>(page->create(services)),
              nullptr);
}

TEST_F(EntryPoint, RegistersTheFooterUnderItsName) {
    ASSERT_TRUE(NimbraBundleRegisterClasses(platform.classes));

    const HeaderFooterClass* footer =
        platform.classes.headerFooterClassNamed("RSPNimbraDriveProgressFooterView");
    ASSERT_NE(footer, nullptr);
    const auto group = Specifier::groupSpecifierWithID("RSPStatusInfo");
    const auto view = footer->initWithSpecifier(*group, platform.services());
    EXPECT_NE(std::dynamic_pointer_cast<RSPNimbraDriveProgressFooterView>(view), nullptr);
    // The timer's handler holds the view.
    platform.workQueues.timers().at(0)->cancel();
}

TEST_F(EntryPoint, SaysThatTheNameOfThePageIsTaken) {
    ASSERT_TRUE(platform.classes.registerClass({.name = "RSPNimbraDriveViewController"}));

    EXPECT_FALSE(NimbraBundleRegisterClasses(platform.classes));
}

TEST_F(EntryPoint, SaysThatTheNameOfTheFooterIsTaken) {
    ASSERT_TRUE(
        platform.classes.registerHeaderFooterClass({.name = "RSPNimbraDriveProgressFooterView"}));

    EXPECT_FALSE(NimbraBundleRegisterClasses(platform.classes));
}

} // namespace
} // namespace nimbra::test

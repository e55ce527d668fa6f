#include "host/core/AccountPage.h"

#include "platform/system/ClassRegistry.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>

namespace nimbra::host {
namespace {

TEST(AccountPage, HasOneGroupWithTheRowThatOpensThePane) {
    test::TestPlatform platform;
    const ControllerClass paneClass{.name = "Pane", .create = {}};
    const auto page = std::make_shared<AccountPage>(platform.services(), "Drive", paneClass,
                                                    UserInfo{{FirstSetupKey, true}});

    const SpecifierArray& rows = page->specifiers();

    ASSERT_EQ(rows.size(), 2U);
    EXPECT_EQ(rows[0]->cellType(), GroupCell);
    EXPECT_EQ(rows[1], page->entryRow());
    EXPECT_EQ(rows[1]->name(), Text("Drive"));
    EXPECT_EQ(rows[1]->detailControllerClass(), &paneClass);
    EXPECT_TRUE(userInfoValue<bool>(rows[1]->userInfo(), FirstSetupKey));
}

TEST(AccountPage, KeepsTheRowThatOpenedThePaneWhenItIsBuiltAnew) {
    test::TestPlatform platform;
    const ControllerClass paneClass{.name = "Pane", .create = {}};
    const auto page =
        std::make_shared<AccountPage>(platform.services(), "Drive", paneClass, UserInfo());
    const auto row = page->entryRow();

    page->reloadSpecifiers();

    EXPECT_EQ(page->specifiers().back(), row);
}

} // namespace
} // namespace nimbra::host

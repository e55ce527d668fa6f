#include "platform/host/SettingsRootController.h"

#include <gtest/gtest.h>
#include <memory>

namespace nimbra {
namespace {

struct Page final : Controller {
    void reloadSpecifiers() override {}
};

struct SettingsRootControllerTest : testing::Test {
    SettingsRootController root;
    std::shared_ptr<Page> page = std::make_shared<Page>();
    std::shared_ptr<Page> other = std::make_shared<Page>();
};

TEST_F(SettingsRootControllerTest, APageHasATaskUntilItHasFinished) {
    EXPECT_FALSE(root.taskIsRunning(page));

    root.addTask(page);
    EXPECT_TRUE(root.taskIsRunning(page));
    EXPECT_FALSE(root.taskIsRunning(other));

    root.taskFinished(page);
    EXPECT_FALSE(root.taskIsRunning(page));
}

TEST_F(SettingsRootControllerTest, APageHasNoSecondTask) {
    root.addTask(page);
    root.addTask(page);

    root.taskFinished(page);

    EXPECT_FALSE(root.taskIsRunning(page));
}

TEST_F(SettingsRootControllerTest, TheEndOfATaskThatNobodyHasIsNothing) {
    root.addTask(other);

    root.taskFinished(page);

    EXPECT_TRUE(root.taskIsRunning(other));
}

TEST_F(SettingsRootControllerTest, ATaskDoesNotKeepItsPage) {
    const std::weak_ptr<Page> weakPage = page;
    root.addTask(page);

    page.reset();

    EXPECT_TRUE(weakPage.expired());
    EXPECT_FALSE(root.taskIsRunning(other));
}

TEST_F(SettingsRootControllerTest, APageHoldsItsRootWeakly) {
    auto ownedRoot = std::make_shared<SettingsRootController>();
    EXPECT_EQ(page->rootController(), nullptr);

    page->setRootController(ownedRoot);
    EXPECT_EQ(page->rootController(), ownedRoot);
    ownedRoot.reset();

    EXPECT_EQ(page->rootController(), nullptr);
}

} // namespace
} // namespace nimbra

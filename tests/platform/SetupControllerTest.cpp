#include "platform/host/SetupController.h"

#include "platform/host/SettingsListController.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>

namespace nimbra {
namespace {

/// A page without rows that counts how often it was asked to build them.
class EmptyPage final : public SettingsListController {
public:
    using SettingsListController::SettingsListController;

    const SpecifierArray& specifiers() override { return _rows; }
    void reloadSpecifiers() override { ++reloads; }

    int reloads = 0;

private:
    SpecifierArray _rows;
};

struct SetupControllerTest : testing::Test {
    test::TestPlatform platform;
    std::shared_ptr<EmptyPage> root = std::make_shared<EmptyPage>(platform.services());
    std::shared_ptr<EmptyPage> parent = std::make_shared<EmptyPage>(platform.services());
    std::shared_ptr<SetupController> holder = std::make_shared<SetupController>(root);
};

TEST_F(SetupControllerTest, ItHoldsItsPageAndFillsTheScreenUnlessItIsASheet) {
    EXPECT_EQ(holder->rootViewController(), root);
    EXPECT_EQ(holder->modalPresentationStyle(), ModalPresentationStyle::fullScreen);
    EXPECT_FALSE(holder->isSheet());

    holder->setModalPresentationStyle(ModalPresentationStyle::formSheet);

    EXPECT_EQ(holder->modalPresentationStyle(), ModalPresentationStyle::formSheet);
    EXPECT_TRUE(holder->isSheet());
}

TEST_F(SetupControllerTest, ThePageLivesAsLongAsItsHolder) {
    const std::weak_ptr<EmptyPage> seen = root;
    root.reset();
    EXPECT_FALSE(seen.expired());

    holder.reset();

    EXPECT_TRUE(seen.expired());
}

TEST_F(SetupControllerTest, TheRowsOfTheParentAreBuiltAnew) {
    holder->setParentController(parent);

    holder->reloadSpecifiers();

    EXPECT_EQ(parent->reloads, 1);
    EXPECT_EQ(root->reloads, 0);
}

TEST_F(SetupControllerTest, WithoutAParentNothingIsBuilt) {
    holder->reloadSpecifiers();
    holder->setParentController(parent);
    parent.reset();

    holder->reloadSpecifiers();

    EXPECT_EQ(holder->parentController(), nullptr);
    EXPECT_EQ(root->reloads, 0);
}

} // namespace
} // namespace nimbra

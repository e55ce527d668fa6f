#include "platform/host/SettingsListController.h"

#include "tests/support/RecordingListObserver.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>

namespace nimbra {
namespace {

using test::labels;
using testing::Test;

/// A page with the rows A, B and C.
class LetterPage final : public SettingsListController {
public:
    using SettingsListController::indexOfSpecifier;
    using SettingsListController::setTable;
    using SettingsListController::SettingsListController;

    const SpecifierArray& specifiers() override {
        if (!_specifiers) {
            ++builds;
            _specifiers = SpecifierArray{a, b, c};
        }
        return *_specifiers;
    }

    std::shared_ptr<Specifier> a = Specifier::groupSpecifierWithID("A");
    std::shared_ptr<Specifier> b = Specifier::groupSpecifierWithID("B");
    std::shared_ptr<Specifier> c = Specifier::groupSpecifierWithID("C");
    int builds = 0;
};

struct SettingsListControllerTest : Test {
    test::TestPlatform platform;
    std::shared_ptr<LetterPage> page = std::make_shared<LetterPage>(platform.services());
    test::RecordingListObserver observer{platform.calls};
    std::shared_ptr<Specifier> x = Specifier::groupSpecifierWithID("X");
    std::shared_ptr<Specifier> y = Specifier::groupSpecifierWithID("Y");

    void SetUp() override { page->setObserver(&observer); }

    [[nodiscard]] std::string rows() const { return labels(page->specifiers()); }
    [[nodiscard]] const std::vector<std::string>& told() const { return platform.calls; }
};

using Calls = std::vector<std::string>;

TEST_F(SettingsListControllerTest, TheRowsAreKeptUntilTheyAreReloaded) {
    static_cast<void>(page->specifiers());
    static_cast<void>(page->specifiers());
    EXPECT_EQ(page->builds, 1);

    page->reloadSpecifiers();

    EXPECT_EQ(page->builds, 2);
    EXPECT_EQ(told(), Calls({"reload A B C"}));
}

TEST_F(SettingsListControllerTest, ARowIsInsertedRightBehindAnother) {
    static_cast<void>(page->specifiers());

    page->insertSpecifierAfterSpecifierAnimated(x, page->b, true);

    EXPECT_EQ(rows(), "A B X C");
    EXPECT_EQ(told(), Calls({"insert X after B, animated"}));
}

TEST_F(SettingsListControllerTest, NothingIsInsertedBehindARowThatIsNotThere) {
    static_cast<void>(page->specifiers());

    page->insertSpecifierAfterSpecifierAnimated(x, y, true);

    EXPECT_EQ(rows(), "A B C");
    EXPECT_EQ(told(), Calls());
}

TEST_F(SettingsListControllerTest, RowsAreAppendedInTheirOrder) {
    static_cast<void>(page->specifiers());

    page->addSpecifiersFromArrayAnimated({x, y}, false);

    EXPECT_EQ(rows(), "A B C X Y");
    EXPECT_EQ(told(), Calls({"append X Y"}));
}

TEST_F(SettingsListControllerTest, AppendingNothingTellsNobody) {
    static_cast<void>(page->specifiers());

    page->addSpecifiersFromArrayAnimated({}, true);

    EXPECT_EQ(told(), Calls());
}

TEST_F(SettingsListControllerTest, RowsAreRemovedAsABlock) {
    static_cast<void>(page->specifiers());

    page->removeContiguousSpecifiersAnimated({page->b, page->c}, true);

    EXPECT_EQ(rows(), "A");
    EXPECT_EQ(told(), Calls({"remove B C, animated"}));
}

TEST_F(SettingsListControllerTest, RowsThatAreNotThereAreNothingToRemove) {
    static_cast<void>(page->specifiers());

    page->removeContiguousSpecifiersAnimated({x, y}, true);
    page->removeSpecifierAnimated(x, true);
    page->removeSpecifierAnimated(nullptr, true);
    page->removeContiguousSpecifiersAnimated({}, true);

    EXPECT_EQ(rows(), "A B C");
    EXPECT_EQ(told(), Calls());
}

TEST_F(SettingsListControllerTest, OfABlockOnlyTheRowsThatAreThereAreRemoved) {
    static_cast<void>(page->specifiers());

    page->removeContiguousSpecifiersAnimated({page->a, x}, true);

    EXPECT_EQ(rows(), "B C");
    EXPECT_EQ(told(), Calls({"remove A, animated"}));
}

TEST_F(SettingsListControllerTest, AListThatIsNotBuiltHasNothingToChange) {
    page->insertSpecifierAfterSpecifierAnimated(x, page->a, true);
    page->addSpecifiersFromArrayAnimated({x}, true);
    page->removeSpecifierAnimated(page->a, true);
    page->reloadSpecifierAnimated(page->a, true);

    EXPECT_EQ(told(), Calls());
    EXPECT_EQ(page->builds, 0);
}

TEST_F(SettingsListControllerTest, OfNestedBracketsTheOutermostIsTold) {
    static_cast<void>(page->specifiers());

    page->beginUpdates();
    page->beginUpdates();
    page->removeSpecifierAnimated(page->a, true);
    page->endUpdates();
    page->endUpdates();

    EXPECT_EQ(told(), Calls({"begin", "remove A, animated", "end"}));
}

TEST_F(SettingsListControllerTest, OnlyARowInTheListIsDrawnAgain) {
    static_cast<void>(page->specifiers());

    page->reloadSpecifierAnimated(page->b, true);
    page->reloadSpecifierAnimated(x, true);

    EXPECT_EQ(told(), Calls({"reload row B, animated"}));
}

TEST_F(SettingsListControllerTest, ARowsPlaceIsItsIndex) {
    EXPECT_EQ(page->indexOfSpecifier(page->b), std::nullopt);
    static_cast<void>(page->specifiers());

    EXPECT_EQ(page->indexOfSpecifier(page->b), 1U);
    EXPECT_EQ(page->indexOfSpecifier(x), std::nullopt);
}

TEST_F(SettingsListControllerTest, WithoutAnObserverTheListChangesAllTheSame) {
    page->setObserver(nullptr);
    page->reloadSpecifiers();

    page->beginUpdates();
    page->insertSpecifierAfterSpecifierAnimated(x, page->a, true);
    page->addSpecifiersFromArrayAnimated({y}, true);
    page->removeSpecifierAnimated(page->b, true);
    page->reloadSpecifierAnimated(x, true);
    page->endUpdates();

    EXPECT_EQ(rows(), "A X C Y");
    EXPECT_EQ(told(), Calls());
}

TEST_F(SettingsListControllerTest, APageShowsItselfInAGroupedTable) {
    EXPECT_EQ(page->table()->style(), TableStyle::grouped);

    page->loadViewIfNeeded();

    EXPECT_EQ(page->view(), page->table());
}

TEST_F(SettingsListControllerTest, AnotherTableLeavesTheViewAsItIs) {
    page->loadViewIfNeeded();
    const auto first = page->table();
    const auto other = std::make_shared<Table>(platform.services(), Rect(), TableStyle::plain);

    page->setTable(other);

    EXPECT_EQ(page->table(), other);
    EXPECT_EQ(page->view(), first);
}

TEST_F(SettingsListControllerTest, TheParentIsHeldWeakly) {
    auto parent = std::make_shared<LetterPage>(platform.services());
    page->setParentController(parent);
    EXPECT_EQ(page->parentController(), parent);

    parent.reset();

    EXPECT_EQ(page->parentController(), nullptr);
}

} // namespace
} // namespace nimbra

#include "platform/host/SettingsListController.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>

namespace nimbra {
namespace {

/// A page with the rows that a test gives it.
class Page final : public SettingsListController {
public:
    using SettingsListController::SettingsListController;

    const SpecifierArray& specifiers() override {
        if (!_specifiers) {
            _specifiers = given;
        }
        return *_specifiers;
    }

    SpecifierArray given;
};

struct IndexPathTest : testing::Test {
    test::TestPlatform platform;
    std::shared_ptr<Page> page = std::make_shared<Page>(platform.services());
    std::shared_ptr<Specifier> group = Specifier::groupSpecifierWithID("G");
    std::shared_ptr<Specifier> emptyGroup = Specifier::groupSpecifierWithID("E");
    std::shared_ptr<Specifier> lastGroup = Specifier::groupSpecifierWithID("L");
    std::shared_ptr<Specifier> a = row("A");
    std::shared_ptr<Specifier> b = row("B");
    std::shared_ptr<Specifier> c = row("C");

    static std::shared_ptr<Specifier> row(const char* name) {
        return Specifier::preferenceSpecifierNamed(name, {.cell = ButtonCell});
    }
    void show(const SpecifierArray& rows) const {
        page->given = rows;
        page->reloadSpecifiers();
    }
};

TEST_F(IndexPathTest, RowsAreCountedWithinTheirGroup) {
    show({group, a, b, emptyGroup, lastGroup, c});

    EXPECT_EQ(page->indexPathForSpecifier(a), (IndexPath{0, 0}));
    EXPECT_EQ(page->indexPathForSpecifier(b), (IndexPath{0, 1}));
    EXPECT_EQ(page->indexPathForSpecifier(c), (IndexPath{2, 0}));
    EXPECT_EQ(page->specifierAtIndexPath({0, 1}), b);
    EXPECT_EQ(page->specifierAtIndexPath({2, 0}), c);
}

TEST_F(IndexPathTest, RowsBeforeTheFirstHeaderAreAGroup) {
    show({a, group, b});

    EXPECT_EQ(page->indexPathForSpecifier(a), (IndexPath{0, 0}));
    EXPECT_EQ(page->indexPathForSpecifier(b), (IndexPath{1, 0}));
}

TEST_F(IndexPathTest, HeadersAndOtherRowsHaveNone) {
    show({group, a});

    EXPECT_EQ(page->indexPathForSpecifier(group), std::nullopt);
    EXPECT_EQ(page->indexPathForSpecifier(b), std::nullopt);
    EXPECT_EQ(page->indexPathForSpecifier(nullptr), std::nullopt);
    EXPECT_EQ(page->specifierAtIndexPath({0, 1}), nullptr);
    EXPECT_EQ(page->specifierAtIndexPath({1, 0}), nullptr);
}

TEST_F(IndexPathTest, AListThatHasNotBeenBuiltHasNone) {
    page->given = {a};

    EXPECT_EQ(page->indexPathForSpecifier(a), std::nullopt);
    EXPECT_EQ(page->specifierAtIndexPath({0, 0}), nullptr);
}

} // namespace
} // namespace nimbra

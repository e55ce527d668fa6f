#include "platform/views/Table.h"

#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>

namespace nimbra {
namespace {

TEST(TableTest, ATableHasTheStyleThatItWasMadeWith) {
    test::TestPlatform platform;

    EXPECT_EQ(Table(platform.services(), {}, TableStyle::plain).style(), TableStyle::plain);
    EXPECT_EQ(Table(platform.services(), {}, TableStyle::grouped).style(), TableStyle::grouped);
}

TEST(TableTest, ATableThatCanBePulledDownHasAControl) {
    test::TestPlatform platform;
    Table table(platform.services(), {}, TableStyle::plain);
    EXPECT_EQ(table.refreshControl(), nullptr);
    const auto control = std::make_shared<RefreshControl>();

    table.setRefreshControl(control);
    EXPECT_EQ(table.refreshControl(), control);
    table.setRefreshControl(nullptr);

    EXPECT_EQ(table.refreshControl(), nullptr);
}

TEST(TableTest, OnlyTheHostKnowsWhichCellsAreOnTheScreen) {
    test::TestPlatform platform;
    Table table(platform.services(), {}, TableStyle::grouped);
    EXPECT_EQ(table.cellForRowAtIndexPath({0, 0}), nullptr);
    const auto cell = std::make_shared<TableCell>(platform.services(), Rect(), "A");

    table.setCellSource([&](const IndexPath& path) { return path.row == 1 ? cell : nullptr; });

    EXPECT_EQ(table.cellForRowAtIndexPath({0, 1}), cell);
    EXPECT_EQ(table.cellForRowAtIndexPath({0, 2}), nullptr);
}

TEST(TableTest, ACellIsCalledAsItsRow) {
    test::TestPlatform platform;

    EXPECT_EQ(TableCell(platform.services(), {}, "A").description(), "<TableCell: A>");
    EXPECT_EQ(TableCell(platform.services(), {}, Text()).description(), "<TableCell: (null)>");
}

} // namespace
} // namespace nimbra

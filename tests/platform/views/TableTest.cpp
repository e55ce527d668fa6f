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

} // namespace
} // namespace nimbra

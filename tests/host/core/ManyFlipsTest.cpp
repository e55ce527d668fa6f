#include "device/DeviceDirectory.h"
#include "host/core/PaneSession.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>
#include <malloc.h>

namespace nimbra::host {
namespace {

constexpr int kFlips = 1000;
constexpr int kWarmUp = 100;

/// Bytes that the program holds; nothing where a sanitizer has replaced the heap.
std::size_t heldBytes() {
    return ::mallinfo2().uordblks;
}

TEST(ManyFlips, AThousandFlipsAreAllSavedAndMemoryDoesNotGrow) {
    const test::TemporaryDirectory directory;
    const auto root = directory.path() / "device";
    ASSERT_TRUE(device::createDeviceDirectory(root, device::DeviceDescription()));
    const auto session = PaneSession::start({.root = root, .bundle = NIMBRA_PANE_BUNDLE});
    ASSERT_TRUE(session) << session.error();
    // Open and not shown: in a window, the status footer would add a registration with each flip,
    // which is meant, but is no memory for this test to complain of.
    ASSERT_TRUE((*session)->openPane({}));

    std::size_t before = 0;
    for (int flip = 0; flip < kFlips; ++flip) {
        const bool on = flip % 2 == 0;
        ASSERT_TRUE((*session)->setRow("Nimbra Drive", on));
        (*session)->settle();
        ASSERT_EQ((*(*session)->row("Nimbra Drive"))->value(), RowValue(on));
        if (flip == kWarmUp) {
            before = heldBytes();
        }
    }

    // What a flip of the other way holds more: the rows in the list.
    constexpr std::size_t slack = 16384;
    EXPECT_LE(heldBytes(), before + slack);
    EXPECT_TRUE((*session)->activity().string().empty());
}

} // namespace
} // namespace nimbra::host

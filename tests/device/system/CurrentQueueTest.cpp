#include "device/system/CurrentQueue.h"

#include <gtest/gtest.h>
#include <thread>

namespace nimbra::device {
namespace {

TEST(CurrentQueueTest, AThreadThatIsNoQueuesIsCalledOther) {
    EXPECT_EQ(currentQueueLabel(), "other");
}

TEST(CurrentQueueTest, ScopesNestAndBelongToTheirThread) {
    const std::string outer = "main";
    const std::string inner = "inner";
    const CurrentQueueScope outerScope(outer);
    {
        const CurrentQueueScope innerScope(inner);
        EXPECT_EQ(currentQueueLabel(), "inner");
        std::jthread([] { EXPECT_EQ(currentQueueLabel(), "other"); });
    }
    EXPECT_EQ(currentQueueLabel(), "main");
}

} // namespace
} // namespace nimbra::device

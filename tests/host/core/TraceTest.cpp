#include "host/core/trace/Trace.h"

#include "device/system/CurrentQueue.h"

#include <gtest/gtest.h>
#include <string>
#include <thread>
#include <vector>

namespace nimbra::host {
namespace {

TEST(Trace, WritesOneObjectALineInTheOrderGiven) {
    std::vector<std::string> lines;
    Trace trace([&](const std::string& line) { lines.push_back(line); });

    trace.write("event", {{"z", 1}, {"a", nullptr}, {"m", true}});

    EXPECT_EQ(lines, std::vector<std::string>{
                         R"({"event":"event","queue":"other","z":1,"a":null,"m":true})"});
}

TEST(Trace, NamesTheQueueOnWhichTheEventHappens) {
    std::string written;
    Trace trace([&](const std::string& line) { written = line; });
    const std::string label = "background";
    const device::CurrentQueueScope scope(label);

    trace.write("event", {});

    EXPECT_EQ(written, R"({"event":"event","queue":"background"})");
}

TEST(Trace, WritesTextThatIsNotUtf8AsReplacementCharacters) {
    std::string written;
    Trace trace([&](const std::string& line) { written = line; });

    trace.write("event", {{"text", "a\xff\nb"}});

    EXPECT_EQ(written, "{\"event\":\"event\",\"queue\":\"other\",\"text\":\"a\uFFFD\\nb\"}");
}

TEST(Trace, WritesNothingMoreOnceItHasEnded) {
    int lines = 0;
    Trace trace([&](const std::string&) { ++lines; });
    trace.write("event", {});

    trace.end();
    trace.write("event", {});

    EXPECT_EQ(lines, 1);
}

TEST(Trace, KeepsTheLinesOfManyThreadsApart) {
    std::vector<std::string> lines;
    Trace trace([&](const std::string& line) { lines.push_back(line); });
    constexpr int writers = 8;
    constexpr int events = 100;
    std::vector<std::thread> threads;
    for (int writer = 0; writer < writers; ++writer) {
        threads.emplace_back([&] {
            for (int event = 0; event < events; ++event) {
                trace.write("event", {{"op", "same"}});
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }

    EXPECT_EQ(lines, std::vector<std::string>(writers * events,
                                              R"({"event":"event","queue":"other","op":"same"})"));
}

} // namespace
} // namespace nimbra::host

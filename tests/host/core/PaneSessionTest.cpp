#include "host/core/PaneSession.h"

#include "device/DeviceDirectory.h"
#include "device/apps/Process.h"
#include "device/apps/ProcessRecord.h"
#include "device/files/Files.h"
#include "device/json/JsonReader.h"
#include "device/system/StandingTime.h"
#include "host/core/RowDescription.h"
#include "host/core/scenario/RunningApplications.h"
#include "host/core/trace/Trace.h"
#include "platform/system/NotificationCenter.h"
#include "tests/device/TestFiles.h"
#include "tests/support/RecordingListObserver.h"
#include "tests/support/TemporaryDirectory.h"

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <gtest/gtest.h>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace nimbra::host {
namespace {

class PaneSessionTest : public testing::Test {
protected:
    void makeDevice(const std::string& description) {
        const auto reader = device::JsonReader::parse(description, "description");
        ASSERT_TRUE(reader) << reader.error();
        const auto given = device::readDeviceDescription(*reader);
        ASSERT_FALSE(reader->problem()) << *reader->problem();
        ASSERT_TRUE(device::createDeviceDirectory(root(), given.description));
    }

    std::unique_ptr<PaneSession> start() {
        auto session =
            PaneSession::start({.root = root(), .bundle = NIMBRA_PANE_BUNDLE, .trace = &_trace});
        EXPECT_TRUE(session) << session.error();
        return std::move(*session);
    }

    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }

    [[nodiscard]] std::ptrdiff_t tracedLinesWith(const std::string& text) const {
        return std::ranges::count_if(
            _lines, [&](const std::string& line) { return line.find(text) != std::string::npos; });
    }

    test::TemporaryDirectory _directory;
    std::vector<std::string> _lines;
    Trace _trace{[this](const std::string& line) { _lines.push_back(line); }};
};

TEST_F(PaneSessionTest, AnAnswerThatComesAtTheEndFindsNobody) {
    makeDevice(R"({"accounts": [{"identifier": "primary", "usesStratafile": false}]})");
    test::writeTestFile(root() / "var/lib/nimbra/device-list.json", R"({"delay": 1})");
    const auto time = std::make_shared<device::StandingTime>(Date());
    auto session = PaneSession::start(
        {.root = root(), .bundle = NIMBRA_PANE_BUNDLE, .trace = &_trace, .timeSource = time});
    ASSERT_TRUE(session);
    ASSERT_TRUE((*session)->openPane({}));
    ASSERT_TRUE((*session)->tapRow("Upgrade to Nimbra Drive"));
    (*session)->settle();
    ASSERT_EQ(tracedLinesWith(R"("op":"request")"), 1);
    // The answer falls due while the session ends: what watches the page goes in between.
    (*session)->setActivityObserver([atTheEnd = std::shared_ptr<void>(nullptr, [&time](void*) {
                                         time->advanceTo(std::chrono::seconds(2));
                                     })] {});
    session->reset();

    EXPECT_EQ(tracedLinesWith(R"("op":"response")"), 0);
}

constexpr const char* deviceWithContainer = R"({"documents": {
    "identity": "token", "containers": [{"identifier": "com.example.notes", "public": true}]}})";

TEST_F(PaneSessionTest, TheSwitchOfAnApplicationEndsItsProcess) {
    makeDevice(R"({"accounts": [{"identifier": "primary", "usesStratafile": true,
                                 "enabled": ["kAccountDataclassTidewater"]}],
        "apps": [{"identifier": "notes", "name": "Notes"}, {"identifier": "clock"}],
        "consent": [{"service": "kPRVServiceTidewater", "bundle": "notes", "granted": true},
                    {"service": "kPRVServiceBrackwater", "bundle": "clock", "granted": true}]})");
    RunningApplications applications(root());
    ASSERT_TRUE(applications.setRunning({"notes", "clock"}));
    const auto processOf = [this](const std::string& name) {
        const auto content = device::readFile(root() / "run/nimbra" / (name + ".pid"));
        const auto record = device::ProcessRecord::parse(content.value());
        return device::Process::withNumber(record.value().process).value();
    };
    const device::Process notes = processOf("notes");
    const device::Process clock = processOf("clock");
    const auto session = start();
    ASSERT_TRUE(session->openPane({}));

    ASSERT_TRUE(session->setRow("Notes", false));
    ASSERT_TRUE(session->setRow("clock", false));
    session->settle();

    constexpr std::chrono::milliseconds atOnce(0);
    EXPECT_TRUE(notes.awaitEnd(atOnce));
    EXPECT_FALSE(std::filesystem::exists(root() / "run/nimbra/notes.pid"));
    // The cloud's database is none of the documents' business.
    EXPECT_FALSE(clock.awaitEnd(atOnce));
    EXPECT_TRUE(std::filesystem::exists(root() / "run/nimbra/clock.pid"));
}

TEST_F(PaneSessionTest, OpensAndClosesThePane) {
    makeDevice("{}");
    const auto session = start();
    EXPECT_FALSE(session->isPaneOpen());

    ASSERT_TRUE(session->openPane({}));
    EXPECT_TRUE(session->isPaneOpen());
    EXPECT_EQ(session->paneTitle(), "Nimbra Drive");
    EXPECT_EQ(RowDescription::of(session->rows()).size(), 2U);

    session->closePane();
    EXPECT_FALSE(session->isPaneOpen());
    session->closePane();
}

TEST_F(PaneSessionTest, ADeviceThatIsNotThereIsAnError) {
    const auto session = PaneSession::start({.root = root()});

    ASSERT_FALSE(session);
    EXPECT_NE(session.error().description.find(root().string()), std::string::npos);
    EXPECT_FALSE(std::filesystem::exists(root()));
}

TEST_F(PaneSessionTest, ABundleThatIsNotThereIsAnErrorAndNoPaneIsOpen) {
    makeDevice("{}");
    const auto session = PaneSession::start({.root = root(), .bundle = root() / "none"});
    ASSERT_TRUE(session);

    EXPECT_FALSE((*session)->openPane({}));
    EXPECT_FALSE((*session)->isPaneOpen());
}

TEST_F(PaneSessionTest, QuickChangesShareRunsOfTheRegistration) {
    makeDevice(deviceWithContainer);
    const auto session = start();
    ASSERT_TRUE(session->openPane({}));
    session->appear();
    session->settle();
    const auto before = tracedLinesWith("registerCurrentProcess");
    ASSERT_EQ(before, 1);

    for (const auto& name :
         {TidewaterIdentityDidChangeNotification, MRContainerListDidChangeNotification,
          TidewaterIdentityDidChangeNotification}) {
        session->post({.name = name});
    }
    session->settle();

    const auto runs = tracedLinesWith("registerCurrentProcess") - before;
    EXPECT_GE(runs, 1);
    EXPECT_LE(runs, 3);
}

TEST_F(PaneSessionTest, ChangesPostedFromManyThreadsWhileThePaneComesAndGoesDoNoHarm) {
    makeDevice(deviceWithContainer);
    const auto session = start();
    ASSERT_TRUE(session->openPane({}));
    constexpr int posters = 4;
    constexpr int rounds = 50;
    std::vector<std::thread> threads;
    for (int poster = 0; poster < posters; ++poster) {
        threads.emplace_back([&] {
            for (int round = 0; round < rounds; ++round) {
                session->post({.name = MRContainerListDidChangeNotification});
            }
        });
    }
    for (int round = 0; round < rounds; ++round) {
        session->appear();
        session->disappear();
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    session->settle();

    EXPECT_EQ(tracedLinesWith("\"unregisterCurrentProcess"), rounds);
    EXPECT_LE(tracedLinesWith("\"registerCurrentProcess"), rounds * (posters + 1));
}

TEST_F(PaneSessionTest, ClosesThePaneWhenItEnds) {
    makeDevice(deviceWithContainer);
    {
        const auto session = start();
        ASSERT_TRUE(session->openPane({}));
        session->appear();
    }
    EXPECT_EQ(tracedLinesWith("\"remove\""), 3);
    EXPECT_EQ(tracedLinesWith("\"unregisterCurrentProcess"), 1);
}

TEST_F(PaneSessionTest, ReplacedTextsServeFromTheNextLookupOn) {
    makeDevice("{}");
    const auto session = start();
    ASSERT_TRUE(session->openPane({}));
    session->appear();

    session->replaceTexts({{"CLOUD_DRIVE", "Drive"}, {"CLOUD_DRIVE_EXPLANATION", "Why"}});
    EXPECT_TRUE(session->row("Nimbra Drive"));

    session->becomeActive();
    EXPECT_TRUE(session->row("Drive"));
    EXPECT_EQ(RowDescription::of(session->rows()).front().footer, Text("Why"));
}

TEST_F(PaneSessionTest, InFirstSetupThePaneGetsTheAccountItself) {
    makeDevice(R"({"accounts": [
        {"identifier": "a", "enabled": ["kAccountDataclassTidewater"]}, {"identifier": "b"}]})");
    const auto session = start();

    ASSERT_TRUE(session->openPane({.account = "a", .firstSetup = true}));

    EXPECT_EQ((*session->row("Nimbra Drive"))->value(), RowValue(true));
    EXPECT_EQ(tracedLinesWith("fetchAccount"), 0);
}

TEST_F(PaneSessionTest, OpensThePaneOnADeviceWithoutAccounts) {
    makeDevice(R"({"accounts": []})");
    const auto session = start();

    ASSERT_TRUE(session->openPane({.firstSetup = true}));

    EXPECT_EQ((*session->row("Nimbra Drive"))->value(), RowValue(false));
}

TEST_F(PaneSessionTest, AFlipOfTheSwitchDrawsTheRowOfTheAccountsPageOnce) {
    makeDevice("{}");
    const auto session = start();
    ASSERT_TRUE(session->openPane({}));
    const auto& page = session->accountPage();
    static_cast<void>(page->specifiers());
    std::vector<std::string> changes;
    test::RecordingListObserver observer(changes);
    page->setObserver(&observer);

    ASSERT_TRUE(session->setRow("Nimbra Drive", true));
    session->settle();

    EXPECT_EQ(changes,
              std::vector<std::string>{"reload row " + page->entryRow()->label().string()});
    page->setObserver(nullptr);
}

} // namespace
} // namespace nimbra::host

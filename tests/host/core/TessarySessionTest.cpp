#include "device/DeviceDirectory.h"
#include "device/DevicePlatform.h"
#include "device/json/JsonReader.h"
#include "host/core/PaneSession.h"
#include "host/core/RowDescription.h"
#include "host/core/trace/Trace.h"
#include "platform/accounts/Account.h"
#include "tests/support/TemporaryDirectory.h"

#include <algorithm>
#include <filesystem>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::host {
namespace {

/// Lets a page do what its own buttons would.
struct Opened : SettingsListController {
    using ViewController::dismissAnimated;
};

void askToGo(const SettingsListController& page) {
    (page.*&Opened::dismissAnimated)(true);
}

constexpr const char* row = "Look Me Up by Email";

/// A session on a device with the settings of the cloud database, its pane open.
class TessarySession : public testing::Test {
protected:
    void start(const std::string& settings = R"({"numAppGroups": 2})") {
        const auto reader = device::JsonReader::parse(
            R"({"accounts": [{"identifier": "primary", "primary": true, "usesStratafile": false,
                              "provisioned": ["kAccountDataclassTSYDatabaseService"],
                              "tessaryAccount": "database"}],
                "databaseSettings": )" +
                settings + "}",
            "description");
        const auto given = device::readDeviceDescription(*reader);
        ASSERT_FALSE(reader->problem()) << *reader->problem();
        const auto made = device::createDeviceDirectory(root(), given.description,
                                                        {.databaseBundle = NIMBRA_DATABASE_BUNDLE});
        ASSERT_TRUE(made) << made.error();
        auto started = PaneSession::start(
            {.root = root(), .bundle = NIMBRA_PANE_BUNDLE, .locale = "en-US", .trace = &_trace});
        ASSERT_TRUE(started) << started.error();
        _session = std::move(*started);
        ASSERT_TRUE(_session->openPane({}));
    }

    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    [[nodiscard]] std::ptrdiff_t tracedLinesWith(const std::string& text) const {
        return std::ranges::count_if(
            _lines, [&](const std::string& line) { return line.find(text) != std::string::npos; });
    }
    [[nodiscard]] std::shared_ptr<SettingsListController> page() {
        return _session->detailPage().page();
    }

    test::TemporaryDirectory _directory;
    std::vector<std::string> _lines;
    Trace _trace{[this](const std::string& line) { _lines.push_back(line); }};
    std::unique_ptr<PaneSession> _session;
};

TEST_F(TessarySession, ALinkOpensThePageOfTheBundleOnTheDatabasesAccount) {
    start();
    EXPECT_EQ(page(), nullptr);

    ASSERT_TRUE(_session->tapRow(row));

    ASSERT_NE(page(), nullptr);
    EXPECT_EQ(_session->detailPage().title(), "Look Me Up");
    EXPECT_EQ(page()->specifier(), *_session->row(row));
    const auto rows = RowDescription::of(page()->specifiers());
    ASSERT_EQ(rows.size(), 3U);
    EXPECT_EQ(rows[0].footer, Text("Who uses one of these groups of apps can find the account "
                                   "database by its email address."));
    EXPECT_EQ(rows[1].name, Text("App Group 1"));
    EXPECT_EQ(rows[2].value, RowValue(true));
    EXPECT_EQ(tracedLinesWith(R"("class":"TSYSettingsController","account":"database")"), 1);
    EXPECT_EQ(tracedLinesWith(R"("fetchAccount","queue":"main","account":"database")"), 0);
}

TEST_F(TessarySession, TheSwitchesOfThePageCanBeSet) {
    start();
    ASSERT_TRUE(_session->tapRow(row));
    const auto rows = page()->specifiers();

    rows.at(1)->setValue(false);

    EXPECT_EQ(rows.at(1)->value(), RowValue(false));
    EXPECT_EQ(rows.at(2)->value(), RowValue(true));
}

TEST_F(TessarySession, ThePageGoesWhenARowOfThePaneIsUsed) {
    start();
    ASSERT_TRUE(_session->tapRow(row));
    ASSERT_TRUE(_session->row("Nimbra Drive"));
    ASSERT_NE(page(), nullptr);

    ASSERT_TRUE(_session->setRow("Nimbra Drive", true));

    EXPECT_EQ(page(), nullptr);
}

TEST_F(TessarySession, ThePageGoesWithThePane) {
    start();
    ASSERT_TRUE(_session->tapRow(row));
    const std::weak_ptr<SettingsListController> weakPage = page();

    _session->closePane();

    EXPECT_TRUE(weakPage.expired());
}

TEST_F(TessarySession, ThePageGoesWithTheSession) {
    start();
    ASSERT_TRUE(_session->tapRow(row));
    const std::weak_ptr<SettingsListController> weakPage = page();

    _session.reset();

    EXPECT_TRUE(weakPage.expired());
}

TEST_F(TessarySession, ALinkUnderAScreenCannotBeOpened) {
    start();
    ASSERT_TRUE(_session->tapRow("Upgrade to Nimbra Drive"));

    const auto tapped = _session->tapRow(row);

    ASSERT_FALSE(tapped);
    EXPECT_EQ(tapped.error().reason, RowRefusal::Reason::covered);
    EXPECT_EQ(page(), nullptr);
    EXPECT_EQ(tracedLinesWith(R"("event":"detail")"), 0);
}

TEST_F(TessarySession, ALinkWithoutItsBundleOpensNothing) {
    start("null");

    ASSERT_TRUE(_session->tapRow(row));

    EXPECT_EQ(page(), nullptr);
    EXPECT_EQ(tracedLinesWith(R"("class":null,"account":"database")"), 1);
}

TEST_F(TessarySession, ThePageMayAskToGo) {
    start();
    ASSERT_TRUE(_session->tapRow(row));
    const std::weak_ptr<SettingsListController> weakPage = page();

    askToGo(*page());
    EXPECT_NE(page(), nullptr);
    _session->settle();

    EXPECT_EQ(page(), nullptr);
    EXPECT_TRUE(weakPage.expired());
    EXPECT_TRUE(_session->isPaneOpen());
}

TEST_F(TessarySession, APageThatAskedToGoTakesNoLaterOneAway) {
    start();
    ASSERT_TRUE(_session->tapRow(row));
    askToGo(*page());

    ASSERT_TRUE(_session->tapRow(row));
    const auto second = page();
    _session->settle();

    EXPECT_EQ(page(), second);
}

} // namespace
} // namespace nimbra::host

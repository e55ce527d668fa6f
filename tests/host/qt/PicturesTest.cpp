#include "device/files/Files.h"
#include "host/core/PaneSession.h"
#include "host/core/scenario/ScenarioPlayer.h"
#include "host/qt/SettingsHost.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <QGuiApplication>
#include <QImage>
#include <QQuickWindow>
#include <filesystem>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <optional>
#include <ostream>
#include <string>
#include <vector>

namespace nimbra::window {
namespace {

using Json = nlohmann::ordered_json;

/// A screen that must look as it has been accepted.
struct Picture {
    std::string name;
    /// What is done on the device, after the pane has been opened and shown.
    Json steps = Json::array();
    QSize size{390, 760};
    std::string locale = "en-US";
    bool dark = false;
    bool contrast = false;
    double textScale = 1;
    /// What the device is like; the sample where nothing is said.
    Json device = nullptr;
    std::string row;
    std::string search;
    bool isBusy = false;
};

std::ostream& operator<<(std::ostream& out, const Picture& picture) {
    return out << picture.name;
}

Json sampleDevice() {
    const auto text = device::readFile(NIMBRA_SAMPLE_DEVICE);
    return Json::parse(text.value());
}

Json olderDevice() {
    return {
        {"accounts", {{{"identifier", "primary"}, {"primary", true}, {"usesStratafile", false}}}},
        {"deviceList",
         {{"needUpgrade", {"Work Phone", "Studio"}}, {"incompatible", {"Attic Tablet"}}}}};
}

Json deviceWithTool(const Json& tool) {
    Json device = sampleDevice();
    device["tool"] = tool;
    return device;
}

Json tap(const std::string& row) {
    return {{"do", "tap"}, {"row", row}};
}

std::vector<Picture> pictures() {
    const Json upgrade = Json::array({tap("Upgrade to Nimbra Drive")});
    const Json question =
        Json::array({tap("Upgrade to Nimbra Drive"), {{"do", "tapButton"}, {"title", "Upgrade"}}});
    const Json collect = Json::array({tap("CLOUD_DRIVE_DIAGNOSE")});
    const QSize pad{900, 760};
    return {
        {.name = "pane"},
        {.name = "pane-dark", .dark = true},
        {.name = "pane-german", .locale = "de-DE"},
        {.name = "pane-japanese", .locale = "ja-JP"},
        {.name = "pane-arabic", .locale = "ar"},
        {.name = "pane-arabic-dark-end",
         .locale = "ar",
         .dark = true,
         .row = "CLOUD_DRIVE_DIAGNOSE"},
        {.name = "pane-contrast", .contrast = true, .row = "Work Files"},
        {.name = "pane-dark-contrast", .dark = true, .contrast = true},
        {.name = "pane-narrow", .size = {320, 640}, .locale = "fr-FR"},
        {.name = "pane-wide", .size = pad},
        {.name = "pane-wide-dark", .size = pad, .dark = true, .row = "Scanner 10"},
        {.name = "pane-large-text", .textScale = 2},
        {.name = "pane-large-text-narrow",
         .size = {320, 640},
         .locale = "de-DE",
         .textScale = 2,
         .row = "CLOUD_DRIVE_DIAGNOSE"},
        {.name = "pane-search", .search = "r"},
        {.name = "pane-search-fruitless", .search = "zebra"},
        {.name = "empty", .device = Json{{"accounts", Json::array()}}},
        {.name = "upgrade", .steps = upgrade, .device = olderDevice()},
        {.name = "upgrade-pad", .steps = upgrade, .size = pad, .device = olderDevice()},
        {.name = "upgrade-pad-dark-large-text",
         .steps = upgrade,
         .size = pad,
         .dark = true,
         .textScale = 2,
         .device = olderDevice()},
        {.name = "alert", .steps = question, .device = olderDevice()},
        {.name = "alert-dark-large-text",
         .steps = question,
         .dark = true,
         .textScale = 2,
         .device = olderDevice()},
        {.name = "busy", .steps = collect, .isBusy = true},
        {.name = "share",
         .steps = collect,
         .device = deviceWithTool({{"exit", 0}, {"writesArchive", true}})},
        {.name = "share-pad-dark",
         .steps = collect,
         .size = pad,
         .dark = true,
         .device = deviceWithTool({{"exit", 0}, {"writesArchive", true}})},
        {.name = "failure", .steps = collect, .device = deviceWithTool({{"exit", 1}})},
        {.name = "database", .steps = Json::array({tap("Look Me Up by Email")})},
    };
}

/// While it lives, the user's own folder is called as in the pictures, and there is no program for
/// mail, whoever draws them.
class SomebodysHome {
public:
    SomebodysHome() {
        for (const char* const name : {"XDG_CONFIG_HOME", "XDG_STATE_HOME"}) {
            set(name, "/nonexistent");
        }
        set("PATH", "/nonexistent");
        set("HOME", "/people/somebody");
    }
    SomebodysHome(const SomebodysHome&) = delete;
    SomebodysHome& operator=(const SomebodysHome&) = delete;
    ~SomebodysHome() {
        for (const auto& [name, value] : _earlier) {
            value ? qputenv(name, *value) : qunsetenv(name);
        }
    }

private:
    void set(const char* name, const char* value) {
        _earlier.emplace_back(name, qEnvironmentVariableIsSet(name) ? std::optional(qgetenv(name))
                                                                    : std::nullopt);
        qputenv(name, value);
    }

    std::vector<std::pair<const char*, std::optional<QByteArray>>> _earlier;
};

class PicturesTest : public testing::TestWithParam<Picture> {
protected:
    void start(const Picture& picture) {
        Json device = picture.device.is_null() ? sampleDevice() : picture.device;
        device["now"] = "2024-03-05T14:07:09Z";
        if (picture.locale == "en-US") {
            device["documents"]["lastSyncDate"] = "2024-03-05T13:00:00Z";
            device["documents"]["lastSyncText"] = "Last synced an hour ago.";
        }
        Json steps = Json::array({{{"do", "open"}}, {{"do", "appear"}}});
        steps.insert(steps.end(), picture.steps.begin(), picture.steps.end());
        const auto scenario = _directory.path() / "scenario.json";
        test::writeTestFile(scenario, Json{{"device", device}, {"steps", steps}}.dump());
        Arguments arguments{.locale = picture.locale,
                            .bundle = NIMBRA_PANE_BUNDLE,
                            .scenario = scenario,
                            .size = picture.size};
        arguments.appearance = {.dark = picture.dark,
                                .highContrast = picture.contrast,
                                .reducedMotion = true,
                                .textScale = picture.textScale};
        auto host = SettingsHost::make(arguments);
        ASSERT_TRUE(host) << host.error();
        _host = std::move(*host);
        _host->window().show();
        _host->player()->begin();
    }

    /// Does all steps, each when nothing is left to do of the one before.
    void play(const Picture& picture) {
        while (_host->player()->hasNext()) {
            const auto done = _host->player()->performNext();
            ASSERT_TRUE(done) << done.error().reason;
            _host->pump().run();
            const bool isLast = !_host->player()->hasNext();
            while (!_host->session().isSettled()) {
                QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
                if (picture.isBusy && isLast && _host->session().activity()) {
                    return;
                }
            }
        }
        settle();
    }

    void settle() const {
        // What is put off to the end of a turn may put off more.
        constexpr int turns = 20;
        for (int turn = 0; turn < turns; ++turn) {
            QCoreApplication::processEvents();
        }
    }

    [[nodiscard]] SettingsHost& host() { return *_host; }

private:
    SomebodysHome _home;
    test::TemporaryDirectory _directory;
    std::unique_ptr<SettingsHost> _host;
};

/// How many of a thousand pixels are not the same to the eye.
int differing(const QImage& left, const QImage& right) {
    constexpr int visible = 40;
    qint64 count = 0;
    for (int y = 0; y < left.height(); ++y) {
        for (int x = 0; x < left.width(); ++x) {
            const QColor one = left.pixelColor(x, y);
            const QColor other = right.pixelColor(x, y);
            const int distance =
                std::max({std::abs(one.red() - other.red()), std::abs(one.green() - other.green()),
                          std::abs(one.blue() - other.blue())});
            count += distance > visible ? 1 : 0;
        }
    }
    return static_cast<int>(1000 * count / (qint64{left.width()} * left.height()));
}

TEST_P(PicturesTest, LooksAsItHasBeenAccepted) {
    const Picture& picture = GetParam();
    start(picture);
    ASSERT_NO_FATAL_FAILURE(play(picture));
    if (!picture.search.empty()) {
        host().pane().rows()->setSearch(QString::fromStdString(picture.search));
        settle();
    }
    if (!picture.row.empty()) {
        ASSERT_TRUE(host().showRow(picture.row));
        settle();
    }

    const QImage shown = host().window().grabWindow();

    const std::string file = picture.name + ".png";
    const auto place = std::filesystem::path(NIMBRA_SHOWN_PICTURES) / file;
    std::filesystem::create_directories(place.parent_path());
    ASSERT_TRUE(shown.save(QString::fromStdString(place.string())));
    const QImage accepted(QString::fromStdString(std::string(NIMBRA_PICTURES) + '/' + file));
    ASSERT_EQ(shown.size(), accepted.size()) << "look at " << place;
    EXPECT_LE(differing(shown, accepted), 2) << "look at " << place;
}

INSTANTIATE_TEST_SUITE_P(Screens, PicturesTest, testing::ValuesIn(pictures()),
                         [](const auto& picture) {
                             std::string name = picture.param.name;
                             std::erase(name, '-');
                             return name;
                         });

} // namespace
} // namespace nimbra::window

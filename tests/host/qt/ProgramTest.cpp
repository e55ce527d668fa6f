#include "device/files/Descriptor.h"
#include "host/core/PaneSession.h"
#include "host/qt/OpenPanes.h"
#include "host/qt/ScenarioDrive.h"
#include "host/qt/Screenshot.h"
#include "tests/device/FullDisk.h"
#include "tests/device/TestFiles.h"
#include "tests/host/qt/WindowFixture.h"
#include "tests/support/ProgramRun.h"

#include <QImage>
#include <QSignalSpy>
#include <algorithm>
#include <array>
#include <climits>
#include <csignal>
#include <sys/inotify.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

namespace nimbra::window {

namespace {

/// The program as the user starts it, and what it does by itself.
class Program : public WindowTest {
protected:
    [[nodiscard]] static std::vector<std::string> command(std::vector<std::string> words) {
        words.insert(words.begin(), NIMBRA_SETTINGSHOST);
        return words;
    }
    [[nodiscard]] std::vector<std::string>
    environment(const std::string& platform = "offscreen") const {
        std::filesystem::create_directories(place("run"));
        std::filesystem::permissions(place("run"), std::filesystem::perms::owner_all);
        return {"HOME=" + home().string(),
                "XDG_STATE_HOME=" + place("state").string(),
                "XDG_RUNTIME_DIR=" + place("run").string(),
                "QT_QPA_PLATFORM=" + platform,
                "QT_QUICK_BACKEND=software",
                "DBUS_SESSION_BUS_ADDRESS=unix:path=/nonexistent"};
    }
    [[nodiscard]] test::ProgramResult run(const std::vector<std::string>& words) const {
        return test::runProgram(command(words), environment());
    }
    [[nodiscard]] static std::ptrdiff_t lineCount(const std::string& text) {
        return std::ranges::count(text, '\n');
    }
    /// Drives a window by the steps, and gives back what could not be done; empty for nothing.
    std::string drive(const std::string& steps) {
        test::writeTestFile(place("scenario.json"), R"({"device": {}, "steps": )" + steps + '}');
        Arguments driven = arguments();
        driven.root.reset();
        driven.scenario = place("scenario.json");
        start(driven);
        if (HasFatalFailure()) {
            return "the window is not there";
        }
        ScenarioDrive drive(*_host);
        QSignalSpy ends(&drive, &ScenarioDrive::ended);
        EXPECT_TRUE(waitFor([&ends] { return ends.count() > 0; }));
        settle();
        EXPECT_EQ(ends.count(), 1);
        return ends.isEmpty() ? "no end" : ends.front().front().toString().toStdString();
    }
};

} // namespace

TEST_F(Program, AScenarioIsPlayedBeforeTheUsersEyes) {
    EXPECT_EQ(drive(R"([{"do": "open"}, {"do": "appear"},
                        {"do": "set", "row": "Nimbra Drive", "value": true}])"),
              "");

    EXPECT_TRUE(pane().isOpen());
    ASSERT_NE(row("Nimbra Drive"), nullptr);
    EXPECT_TRUE(row("Nimbra Drive")->property("isOn").toBool());
}

TEST_F(Program, AStepThatCannotBeDoneIsTold) {
    const std::string problem = drive(R"([{"do": "open"}, {"do": "tap", "row": "No Such Row"}])");

    EXPECT_EQ(problem.rfind("step 1 (tap): ", 0), 0U) << problem;
    EXPECT_NE(problem.find("No Such Row"), std::string::npos);
}

TEST_F(Program, AScenarioThatIsNoneIsAnError) {
    test::writeTestFile(place("scenario.json"), "[]");
    Arguments driven = arguments();
    driven.root.reset();
    driven.scenario = place("scenario.json");

    EXPECT_FALSE(SettingsHost::make(driven));
}

TEST_F(Program, APictureIsTakenWhenNothingMoves) {
    makeUsedDevice();
    openPane();
    Screenshot screenshot(window(), session());
    QSignalSpy taken(&screenshot, &Screenshot::taken);

    ASSERT_TRUE(waitFor([&taken] { return taken.count() > 0; }));

    EXPECT_EQ(taken.front().front().value<QImage>(), window().grabWindow());
}

TEST_F(Program, ItPutsAPictureOfTheSizeWhereItIsTold) {
    makeUsedDevice();
    const auto picture = place("picture.png");

    const auto result = run({"--root", root().string(), "--row", "Notes", "--size", "500x640",
                             "--motion", "reduced", "--screenshot", picture.string()});

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_EQ(result.messages, "");
    const QImage image(QString::fromStdString(picture.string()), "PNG");
    EXPECT_EQ(image.size(), QSize(500, 640));
    // There is something on it.
    const QRgb first = image.pixel(0, 0);
    bool isEven = true;
    for (int y = 0; y < image.height(); ++y) {
        for (int x = 0; x < image.width(); ++x) {
            isEven = isEven && image.pixel(x, y) == first;
        }
    }
    EXPECT_FALSE(isEven);
}

TEST_F(Program, APictureAfterACrashIsOfWhatWasAskedForAndLeavesTheWordAboutIt) {
    // Given the picture of a row, and a crash after it
    makeUsedDevice();
    const auto takePicture = [this](const std::string& row, const std::string& name) {
        return run({"--root", root().string(), "--row", row, "--motion", "reduced", "--screenshot",
                    place(name).string()});
    };
    ASSERT_EQ(takePicture("Notes", "before.png").status, 0);
    dieWithThePaneOpen();

    // When the row is asked for again, and one that is not there
    const auto result = takePicture("Notes", "after.png");
    const auto refused = takePicture("No Such Row", "none.png");

    // Then all is as before
    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_EQ(result.messages, "");
    const QImage before(QString::fromStdString(place("before.png").string()));
    ASSERT_FALSE(before.isNull());
    EXPECT_EQ(QImage(QString::fromStdString(place("after.png").string())), before);
    EXPECT_EQ(refused.status, 1);
    EXPECT_EQ(lineCount(refused.messages), 1) << refused.messages;
    EXPECT_NE(refused.messages.find("No Such Row"), std::string::npos);
    EXPECT_FALSE(std::filesystem::exists(place("none.png")));

    // and the next window still tells of the crash
    EXPECT_TRUE(OpenPanes(place("state") / "nimbra" / "settingshost").takeDied(root()).died);
}

TEST_F(Program, APictureThatCannotBeWrittenIsOneLineAndNoFile) {
    makeUsedDevice();
    const auto picture = place("none") / "picture.png";

    const auto result = run({"--root", root().string(), "--screenshot", picture.string()});

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.messages, "settingshost: " + picture.string() +
                                   ": cannot be written: No such file or directory\n");
    EXPECT_FALSE(std::filesystem::exists(picture.parent_path()));
}

TEST_F(Program, APictureOnAFullDiskIsNoneAndLeavesTheEarlierOne) {
    const auto place = this->place("picture.png");
    const QString name = QString::fromStdString(place.string());
    QImage picture(1, 1, QImage::Format_RGB32);
    picture.fill(Qt::white);
    ASSERT_TRUE(Screenshot::save(picture, name));
    const std::string before = test::contentOf(place);

    {
        const test::FullDisk full;
        EXPECT_EQ(Screenshot::save(picture, name).error(), "File too large")
            << "which is how the disk is full here";
        EXPECT_FALSE(Screenshot::save(picture, name + QStringLiteral(".new")));
    }

    EXPECT_EQ(QImage(name).size(), QSize(1, 1));
    EXPECT_EQ(test::contentOf(place), before);
    EXPECT_FALSE(std::filesystem::exists(place.string() + ".new"));
}

TEST_F(Program, APictureTakesThePlaceOfNothingButAPlainFile) {
    QImage picture(1, 1, QImage::Format_RGB32);
    picture.fill(Qt::white);
    const auto pipe = place("pipe.png");
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    std::filesystem::create_directory(place("folder.png"));
    std::filesystem::create_symlink("pipe.png", place("link.png"));

    for (const std::string name : {"pipe.png", "folder.png", "link.png"}) {
        EXPECT_EQ(Screenshot::save(picture, QString::fromStdString(place(name).string())).error(),
                  "is not a plain file")
            << name;
    }

    EXPECT_TRUE(std::filesystem::is_fifo(pipe));
    EXPECT_TRUE(std::filesystem::is_symlink(place("link.png")));
}

TEST_F(Program, APictureWithoutANameIsABadOption) {
    makeUsedDevice();

    const auto result = run({"--root", root().string(), "--screenshot", ""});

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.messages, "settingshost: --screenshot: is empty (see settingshost --help)\n");
}

TEST_F(Program, APathThatIsEmptyIsABadOption) {
    for (const std::string option : {"--root", "--bundle", "--scenario"}) {
        const auto result = run({option, "", "--screenshot", place("picture.png").string()});

        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.messages,
                  "settingshost: " + option + ": is empty (see settingshost --help)\n");
    }
}

TEST_F(Program, ALanguageThatIsNoneIsABadOption) {
    const auto result = run({"--locale", "x!"});

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.messages, "settingshost: --locale: \"x!\" is not a language tag such as "
                               "\"de-DE\" (see settingshost --help)\n");
}

TEST_F(Program, AScenarioEndsInAPicture) {
    test::writeTestFile(place("scenario.json"), R"({"device": {}, "steps": [{"do": "open"}]})");
    const auto picture = place("picture.png");

    const auto result = run({"--scenario", place("scenario.json").string(), "--screenshot",
                             picture.string(), "--motion", "reduced"});

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_EQ(QImage(QString::fromStdString(picture.string())).size(), QSize(390, 760));
}

TEST_F(Program, AStepThatCannotBeDoneEndsTheProgram) {
    test::writeTestFile(place("scenario.json"),
                        R"({"device": {}, "steps": [{"do": "open"}, {"do": "answer"}]})");

    const auto wrong = run({"--scenario", place("scenario.json").string()});
    EXPECT_EQ(wrong.status, 2);
    EXPECT_EQ(lineCount(wrong.messages), 1) << wrong.messages;

    test::writeTestFile(place("scenario.json"),
                        R"({"device": {}, "steps": [{"do": "open"}, {"do": "tap", "row": "X"}]})");
    const auto failed = run({"--scenario", place("scenario.json").string()});
    EXPECT_EQ(failed.status, 1);
    EXPECT_EQ(failed.messages.rfind("settingshost: step 1 (tap): ", 0), 0U) << failed.messages;
    EXPECT_EQ(lineCount(failed.messages), 1) << failed.messages;
}

TEST_F(Program, ARowThatIsNotThereEndsItWithOneLine) {
    makeUsedDevice();

    const auto result = run({"--root", root().string(), "--row", "No Such Row"});

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(lineCount(result.messages), 1) << result.messages;
    EXPECT_NE(result.messages.find("No Such Row"), std::string::npos);
}

TEST_F(Program, ADeviceThatCannotBeUsedEndsItWithOneLine) {
    std::filesystem::create_directory(root());

    const auto result = run({"--root", root().string()});

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(lineCount(result.messages), 1) << result.messages;
    EXPECT_NE(result.messages.find(root().string()), std::string::npos);
}

TEST_F(Program, AnAccountThatIsNotThereEndsItWithOneLine) {
    makeSampleDevice();

    const auto result = run({"--root", root().string(), "--account", "nobody"});

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.messages,
              "settingshost: no account \"nobody\" (accounts: \"primary\", \"older\")\n");
}

TEST_F(Program, WithoutADisplayOneLineTellsSo) {
    makeUsedDevice();

    const auto result =
        test::runProgram(command({"--root", root().string()}), environment("no-such-platform"));

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.messages, "settingshost: there is no display that can be used\n");
}

TEST_F(Program, ASignalClosesThePaneInOrder) {
    // Given a program with its pane open
    makeUsedDevice();
    const auto marks = place("state") / "nimbra" / "settingshost";
    std::filesystem::create_directories(marks);
    const device::Descriptor watch(::inotify_init1(IN_CLOEXEC));
    ASSERT_GE(::inotify_add_watch(watch.number(), marks.c_str(), IN_CREATE), 0);
    const pid_t process = test::startProgram(command({"--root", root().string(), "--row", "Notes"}),
                                             environment(), {-1, -1, -1});
    std::array<char, sizeof(inotify_event) + NAME_MAX + 1> event{};
    ASSERT_GT(::read(watch.number(), event.data(), event.size()), 0);

    // When it is asked to end
    ::kill(process, SIGTERM);
    int status = 0;
    ASSERT_EQ(::waitpid(process, &status, 0), process);

    // Then it has ended so, and the next one has nothing to tell
    EXPECT_EQ(test::exitStatusOf(status), -SIGTERM);
    EXPECT_FALSE(OpenPanes(marks).takeDied(root()).died);
}

} // namespace nimbra::window

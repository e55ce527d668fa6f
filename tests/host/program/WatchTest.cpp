#include "tests/host/program/Program.h"
#include "tests/host/program/TypedProgram.h"

#include <array>
#include <csignal>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <string>
#include <sys/wait.h>
#include <unistd.h>

namespace nimbra::test {
namespace {

/// settingsctl watching, with its lines read from a pipe.
class WatchingProgram {
public:
    WatchingProgram(const Program& program, const std::string& device) {
        std::array<int, 2> pipe{};
        EXPECT_EQ(::pipe2(pipe.data(), O_CLOEXEC), 0);
        _process = program.start({"--root", device, "watch"}, pipe[1]);
        ::close(pipe[1]);
        _output = pipe[0];
    }
    WatchingProgram(const WatchingProgram&) = delete;
    WatchingProgram& operator=(const WatchingProgram&) = delete;
    ~WatchingProgram() { ::close(_output); }

    /// The next line; "nothing" at the end of the output.
    [[nodiscard]] std::string nextLine() {
        while (true) {
            if (const auto end = _read.find('\n'); end != std::string::npos) {
                std::string line = _read.substr(0, end);
                _read.erase(0, end + 1);
                return line;
            }
            std::array<char, 4096> more{};
            const ssize_t count = ::read(_output, more.data(), more.size());
            if (count <= 0) {
                return "nothing";
            }
            _read.append(more.data(), static_cast<std::size_t>(count));
        }
    }

    void closeOutput() {
        ::close(_output);
        _output = -1;
    }
    void send(int signal) const { ::kill(_process, signal); }

    [[nodiscard]] int end() const {
        int status = 0;
        ::waitpid(_process, &status, 0);
        return exitStatusOf(status);
    }

private:
    int _output = -1;
    pid_t _process = -1;
    std::string _read;
};

class Watch : public testing::Test {
protected:
    /// A device whose last sync is told in these words, with the switch on or off.
    std::string makeDevice(const std::string& sentence, bool isOn = true) {
        const std::string enabled = isOn ? R"("kAccountDataclassTidewater")" : "";
        const auto description = _program.write(
            "device.json",
            R"({"accounts": [{"identifier": "primary", "primary": true, "usesStratafile": true,
                              "enabled": [)" +
                enabled + R"(]}], "documents": {"lastSyncDate": "2024-03-05T14:00:00Z",
                                "lastSyncText": )" +
                sentence + "}}");
        const std::string device = _program.path("device").string();
        EXPECT_EQ(_program.run({"init", device, "--from", description.string()}).status, 0);
        return device;
    }

    /// Writes a progress the way that whoever syncs does: whole or not at all.
    void writeProgress(const std::string& device, const std::string& name,
                       const std::string& content) {
        const auto place = std::filesystem::path(device) / "run/nimbra/progress";
        std::ofstream(place / ("." + name)) << content;
        std::filesystem::rename(place / ("." + name), place / name);
    }
    static void removeProgress(const std::string& device, const std::string& name) {
        std::filesystem::remove(std::filesystem::path(device) / "run/nimbra/progress" / name);
    }

    Program _program;
};

TEST_F(Watch, PrintsALineForEachChangeUntilItIsInterrupted) {
    const std::string device = makeDevice(R"("Synced at two.")");
    WatchingProgram watching(_program, device);
    EXPECT_EQ(watching.nextLine(), "Synced at two.");

    writeProgress(device, "sync.json", R"({"fraction": 0.4, "description": "Uploading"})");
    EXPECT_EQ(watching.nextLine(), "40 %  Uploading");
    writeProgress(device, "sync.json",
                  R"({"fraction": 0.4, "description": "Uploading", "additional": "2 of 5"})");
    EXPECT_EQ(watching.nextLine(), "40 %  Uploading (2 of 5)");
    removeProgress(device, "sync.json");
    EXPECT_EQ(watching.nextLine(), "Synced at two.");

    watching.send(SIGTERM);
    EXPECT_EQ(watching.nextLine(), "nothing");
    EXPECT_EQ(watching.end(), 0);
}

TEST_F(Watch, EndsAtEachSignalWithWhichAPersonEndsAProgram) {
    const std::string device = makeDevice(R"("Synced at two.")");
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
        WatchingProgram watching(_program, device);
        EXPECT_EQ(watching.nextLine(), "Synced at two.");
        watching.send(signal);
        EXPECT_EQ(watching.end(), 0) << signal;
    }
}

TEST_F(Watch, EndsWhenNobodyReadsItAnyMore) {
    const std::string device = makeDevice(R"("Synced at two.")");
    WatchingProgram watching(_program, device);
    EXPECT_EQ(watching.nextLine(), "Synced at two.");

    watching.closeOutput();

    EXPECT_EQ(watching.end(), 0);
}

TEST_F(Watch, AnOutputThatCannotBeWrittenIsAFailure) {
    const std::string device = makeDevice(R"("Synced at two.")");

    const auto result = _program.runOther(
        {"/bin/sh", "-c", R"("$0" --root "$1" list >/dev/full)", NIMBRA_SETTINGSCTL, device});

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages, "settingsctl: the output cannot be written\n");
}

TEST_F(Watch, LeavesNoSocketBehind) {
    const std::string device = makeDevice(R"("Synced at two.")");
    const auto sockets = std::filesystem::path(device) / "run/nimbra/notifications";
    WatchingProgram watching(_program, device);
    EXPECT_EQ(watching.nextLine(), "Synced at two.");
    ASSERT_TRUE(std::filesystem::exists(sockets));
    EXPECT_FALSE(std::filesystem::is_empty(sockets));

    watching.send(SIGINT);
    EXPECT_EQ(watching.end(), 0);

    EXPECT_TRUE(std::filesystem::is_empty(sockets));
}

TEST_F(Watch, AFileThatIsNoProgressChangesNothing) {
    const std::string device = makeDevice(R"("Synced at two.")");
    WatchingProgram watching(_program, device);
    EXPECT_EQ(watching.nextLine(), "Synced at two.");

    writeProgress(device, "bad.json", R"({"fraction": "half"})");
    writeProgress(device, "copy.json", R"({"fraction": 0.5, "fileOperationKind": "copying"})");
    writeProgress(device, "sync.json", R"({"fraction": 1, "description": "Done"})");

    EXPECT_EQ(watching.nextLine(), "100 %  Done");
    watching.send(SIGINT);
    EXPECT_EQ(watching.end(), 0);
}

TEST_F(Watch, HasNothingToShowWhereTheSwitchIsOff) {
    const std::string device = makeDevice("null", false);

    const auto result = _program.run({"--root", device, "watch"});

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.messages, "settingsctl: the page shows no status: its switch is off\n");
}

TEST_F(Watch, ATerminalHasOneLineThatIsDrawnAnew) {
    const std::string device = makeDevice(R"("Synced at two.")");
    TypedProgram watching(_program, {"--root", device, "watch"});
    ASSERT_TRUE(watching.shows("\r\x1b[KSynced at two."));

    writeProgress(device, "sync.json", R"({"fraction": 0.5, "description": "Uploading"})");
    ASSERT_TRUE(watching.shows("\r\x1b[K[##########----------] 50 %  Uploading"));
    watching.type("\x03");

    EXPECT_EQ(watching.end(), 0);
}

TEST_F(Watch, TheListShowsTheSentenceUnderTheSwitch) {
    const std::string device = makeDevice(R"("Synced at two.")");

    const auto result = _program.run({"--root", device, "list"});

    EXPECT_EQ(result.status, 0);
    const auto sentence = result.output.find("\n    Synced at two.\n");
    EXPECT_NE(sentence, std::string::npos) << result.output;
    EXPECT_LT(result.output.find("Nimbra Drive    "), sentence);
}

TEST_F(Watch, TheListShowsTheSyncThatIsUnderWay) {
    const std::string device = makeDevice(R"("Synced at two.")");
    std::filesystem::create_directories(std::filesystem::path(device) / "run/nimbra/progress");
    writeProgress(device, "sync.json", R"({"fraction": 0.25, "description": "Uploading"})");

    const auto result = _program.run({"--root", device, "list"});

    EXPECT_EQ(result.status, 0);
    EXPECT_NE(result.output.find("\n    25 %  Uploading\n"), std::string::npos) << result.output;
}

TEST_F(Watch, TheListHasNoLineWhereThereIsNothingToSay) {
    const std::string device = _program.makePlainDevice("device");

    const auto result = _program.run({"--root", device, "list"});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output.find("   \n"), std::string::npos) << result.output;
}

} // namespace
} // namespace nimbra::test

#include "tests/house/Command.h"
#include "tests/house/ScratchTree.h"

#include <filesystem>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

/// A checkout of the script alone, with stand-ins that say how they were called.
class RunScript : public testing::Test {
protected:
    void SetUp() override {
        std::filesystem::copy_file(std::filesystem::path(NIMBRA_SOURCE_DIR) / "run",
                                   tree.root() / "run");
        for (const std::string program : {"tools/dev/build", "build/release/bin/settingsctl",
                                          "build/release/bin/settingshost"}) {
            const std::string name = std::filesystem::path(program).filename();
            tree.writeProgram(program, "#!/bin/sh\necho " + name + " \"$@\"\n");
        }
    }

    /// What is called, a line each, where `display` are the variables that are set.
    [[nodiscard]] std::string calls(const std::vector<std::string>& display,
                                    const std::vector<std::string>& arguments = {}) const {
        std::vector<std::string> command{"env", "-u", "DISPLAY", "-u", "WAYLAND_DISPLAY"};
        command.insert(command.end(), display.begin(), display.end());
        command.push_back(tree.root() / "run");
        command.insert(command.end(), arguments.begin(), arguments.end());
        const CommandResult result = run(command);
        EXPECT_EQ(result.status, 0) << result.output;
        return result.output;
    }

    ScratchTree tree;
};

constexpr const char* window = "build release settingshost NimbraDriveSettings\nsettingshost\n";
constexpr const char* list = "build release settingsctl NimbraDriveSettings\nsettingsctl list\n";

TEST_F(RunScript, OpensTheWindowWhereThereIsADisplay) {
    EXPECT_EQ(calls({"DISPLAY=:0"}), window);
    EXPECT_EQ(calls({"WAYLAND_DISPLAY=wayland-0"}), window);
}

TEST_F(RunScript, PrintsTheListWhereThereIsNeitherDisplayNorTerminal) {
    EXPECT_EQ(calls({}), list);
}

TEST_F(RunScript, TakesAnEmptyNameForNoDisplay) {
    EXPECT_EQ(calls({"DISPLAY=", "WAYLAND_DISPLAY="}), list);
}

TEST_F(RunScript, GivesItsArgumentsToTheCommandLineEvenWhereThereIsADisplay) {
    EXPECT_EQ(calls({"DISPLAY=:0"}, {"get", "Nimbra Drive"}),
              "build release settingsctl NimbraDriveSettings\nsettingsctl get Nimbra Drive\n");
}

} // namespace
} // namespace nimbra::test

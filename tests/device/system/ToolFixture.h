#pragma once

#include "device/system/DeviceProcesses.h"
#include "tests/device/TestFiles.h"
#include "tests/support/ProgramRun.h"
#include "tests/support/TemporaryDirectory.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <optional>
#include <string>
#include <vector>

namespace nimbra::test {

/// A device with scripts on it.
class ToolFixture : public testing::Test {
protected:
    ToolFixture() { std::filesystem::create_directory(root()); }

    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    [[nodiscard]] device::DeviceProcesses& processes() { return *_processes; }
    void endProcesses() { _processes.reset(); }

    /// Puts a script at /tool, or elsewhere on the device.
    void write(const std::string& script, const std::string& path = "/tool") const {
        const auto place = root() / path.substr(1);
        writeTestFile(place, "#!/bin/sh\n" + script + '\n');
        std::filesystem::permissions(place, std::filesystem::perms(0755));
    }

    /// Starts the program at `path` with its output into the device's file /out.
    [[nodiscard]] std::expected<pid_t, int>
    start(std::vector<std::string> arguments = {},
          std::optional<std::vector<std::string>> environment = {},
          const std::string& path = "/tool") {
        SpawnFileActions actions;
        actions.addopen(1, "/out", O_WRONLY | O_CREAT | O_TRUNC, 0644);
        actions.addopen(2, "/dev/null", O_RDWR, 0666);
        arguments.insert(arguments.begin(), path);
        return _processes->posix_spawn({.path = path,
                                        .fileActions = actions,
                                        .arguments = std::move(arguments),
                                        .environment = std::move(environment)});
    }
    /// Runs it to its end: its exit status, or minus the signal's number.
    [[nodiscard]] int run(std::vector<std::string> arguments = {},
                          std::optional<std::vector<std::string>> environment = {}) {
        const auto process = start(std::move(arguments), std::move(environment));
        EXPECT_TRUE(process) << process.error();
        const auto status = process ? _processes->waitpid(*process) : std::unexpected(0);
        EXPECT_TRUE(status) << status.error();
        return status ? exitStatusOf(*status) : 1000;
    }
    [[nodiscard]] std::string output() const { return contentOf(root() / "out"); }

private:
    TemporaryDirectory _directory;
    std::optional<device::DeviceProcesses> _processes{
        std::in_place, device::DevicePaths(_directory.path() / "device")};
};

} // namespace nimbra::test

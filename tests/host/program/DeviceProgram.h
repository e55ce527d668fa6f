#pragma once

#include "tests/host/program/Program.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::test {

/// settingsctl, and a device of its own that it is run on.
class DeviceProgram : public testing::Test {
protected:
    /// Makes the device as `description` has it, in place of the one that was there.
    void makeDevice(const std::string& description) const {
        std::filesystem::remove_all(program.path("device"));
        const auto file = program.write("device.json", description);
        const auto made =
            program.run({"init", program.path("device").string(), "--from", file.string()});
        EXPECT_EQ(made.status, 0) << made.messages;
        EXPECT_EQ(made.messages, "");
    }
    /// `arguments` for that device.
    [[nodiscard]] std::vector<std::string> onDevice(std::vector<std::string> arguments) const {
        arguments.insert(arguments.begin(), {"--root", program.path("device").string()});
        return arguments;
    }
    [[nodiscard]] ProgramResult run(const std::vector<std::string>& arguments,
                                    const std::string& input = {}) const {
        return program.run(onDevice(arguments), input);
    }

    Program program;
};

} // namespace nimbra::test

#pragma once

#include <expected>
#include <filesystem>
#include <string>

namespace nimbra::mrctl {

enum class Command { diagnose, status };

// What the program tells its caller when it ends.

inline constexpr int exitDone = 0;
/// What was asked for could not be done.
inline constexpr int exitFailed = 1;
/// The question itself is wrong.
inline constexpr int exitBadArguments = 2;

/// What the user asked for on the command line.
struct Arguments {
    Command command = Command::status;
    /// The device; this machine by default.
    std::filesystem::path root = "/";
    /// diagnose: where the archive is to stand on this machine.
    std::string path;
    /// diagnose: the archive has no log.
    bool withoutLog = false;
    /// status: as JSON.
    bool asJson = false;

    /// What the command line says; the exit status where the program is to end at once, because
    /// help or the version was asked for, or because the line makes no sense. That has been
    /// printed then.
    [[nodiscard]] static std::expected<Arguments, int> parse(int count, char** words);
};

} // namespace nimbra::mrctl

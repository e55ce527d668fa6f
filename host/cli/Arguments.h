#pragma once

#include <expected>
#include <filesystem>
#include <optional>
#include <string>

namespace nimbra::cli {

enum class Command {
    list,
    get,
    set,
    tap,
    watch,
    init,
    play,
    shell,
    completion,
    completeRows,
    completeIdentifiers
};

/// What the user asked for on the command line.
struct Arguments {
    Command command = Command::list;

    // For every command that opens the pane on a device.

    std::optional<std::filesystem::path> root;
    std::optional<std::string> account;
    bool firstSetup = false;

    std::optional<std::string> locale;
    std::optional<std::filesystem::path> bundle;

    /// list: as JSON.
    bool json = false;
    /// get, set, tap.
    std::string row;
    /// tap: every question is answered with yes.
    bool saysYes = false;
    /// set: "on" or "off".
    std::string value;
    /// init.
    std::filesystem::path directory;
    std::optional<std::filesystem::path> from;
    /// play.
    std::string scenario;
    std::optional<std::filesystem::path> keep;
    /// completion: "bash" or "zsh".
    std::string shellName;

    /// What the command line says; the exit status where the program is to end at once, because
    /// help or the version was asked for, or because the line makes no sense. That has been
    /// printed then.
    [[nodiscard]] static std::expected<Arguments, int> parse(int count, char** words);
};

} // namespace nimbra::cli

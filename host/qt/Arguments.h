#pragma once

#include "host/qt/Appearance.h"

#include <QSize>
#include <expected>
#include <filesystem>
#include <optional>
#include <string>

namespace nimbra::window {

/// What the user asked for on the command line.
struct Arguments {
    std::optional<std::filesystem::path> root;
    std::optional<std::string> account;
    bool firstSetup = false;
    std::optional<std::string> locale;
    std::optional<std::filesystem::path> bundle;
    /// The pane is opened, and this row of it shown.
    std::optional<std::string> row;
    /// The window is driven by this scenario, on a device of its own.
    std::optional<std::filesystem::path> scenario;
    /// The window ends when nothing moves any more, and what it shows is put here.
    std::optional<std::filesystem::path> screenshot;
    /// In points.
    QSize size{390, 760};
    Appearance::Choice appearance;

    /// What the command line says; the exit status where the program is to end at once, because
    /// help or the version was asked for, or because the line makes no sense. That has been
    /// printed then.
    [[nodiscard]] static std::expected<Arguments, int> parse(int count, char** words);
};

} // namespace nimbra::window

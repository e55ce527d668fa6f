#include "device/description/DeviceTool.h"

#include "device/DeviceError.h"
#include "device/files/Files.h"
#include "device/files/Folders.h"

#include <string>
#include <string_view>
#include <system_error>

namespace nimbra::device {

namespace {

using Tool = DeviceDescription::Tool;

// The scripts use nothing but what a shell has built in: the tool is run without an environment.
constexpr std::string_view interpreter = "#!/bin/sh\n";

// An archive of no files.
constexpr std::string_view writingOfArchive =
    "for archive; do :; done\n"
    R"(printf '\037\213\010\000\000\000\000\000\000\003\143\140\030\005\243\140\024\214\124)"
    R"(\000\000\056\257\265\357\000\004\000\000' >"$archive" || exit 1)"
    "\n";

/// `text` as one word of a shell.
std::string quoted(const std::string& text) {
    std::string word = "'";
    for (const char character : text) {
        word += character == '\'' ? std::string("'\\''") : std::string(1, character);
    }
    return word + '\'';
}

std::string scriptOf(const Tool& tool, const std::filesystem::path& real) {
    std::string script(interpreter);
    if (tool.kind == Tool::Kind::real) {
        // The device may have been moved, and links may lead to the tool: the device is the nearest
        // folder above it that has a device's state.
        return script + "root=${0%/*}\nuntil [ -d \"$root" + std::string(kStateDirectory) +
               "\" ]; do\n  [ -n \"$root\" ] || exit 1\n  root=${root%/*}\ndone\nexec " +
               quoted(real.string()) + " --root \"$root/\" \"$@\"\n";
    }
    if (tool.writesArchive) {
        script += writingOfArchive;
    }
    if (tool.signal) {
        // Without a core file, which would show in the status.
        script += "ulimit -c 0\nkill -" + std::to_string(*tool.signal) + " $$\n";
    }
    return script + "exit " + std::to_string(tool.exitStatus) + '\n';
}

std::expected<void, Error> removeTool(const DevicePaths& paths) {
    const auto folder = paths.resolve(kToolDirectory);
    if (!folder) {
        return std::unexpected(folder.error());
    }
    const auto place = *folder / std::filesystem::path(kTool).filename();
    std::error_code failure;
    std::filesystem::remove(place, failure);
    if (failure) {
        return std::unexpected(fileError(place, "cannot be removed", failure.value()));
    }
    return {};
}

} // namespace

std::expected<void, Error> replaceTool(const DevicePaths& paths, const Tool& tool,
                                       const std::filesystem::path& real) {
    if (tool.kind == Tool::Kind::missing || (tool.kind == Tool::Kind::real && real.empty())) {
        return removeTool(paths);
    }
    std::error_code failure;
    const auto program = std::filesystem::absolute(real, failure);
    if (failure && tool.kind == Tool::Kind::real) {
        return std::unexpected(fileError(real, "cannot be found", failure.value()));
    }
    const auto folder = makeFolder(paths, kToolDirectory);
    if (!folder) {
        return std::unexpected(folder.error());
    }
    constexpr mode_t runnableByEverybody = 0755;
    return writeFileAtomically(*folder / std::filesystem::path(kTool).filename(),
                               scriptOf(tool, program), runnableByEverybody);
}

} // namespace nimbra::device

// The archive of diagnostics: the document service's command-line tool writes it into a directory
// of its own. All of it runs in the background, and blocks there.
#include "pane/RSPNimbraDriveViewController.h"
#include "platform/system/Clock.h"
#include "platform/system/DeviceInfo.h"
#include "platform/system/FileManager.h"
#include "platform/system/Localization.h"
#include "platform/system/Processes.h"
#include "support/LogMessages.h"

#include <array>
#include <fcntl.h>
#include <string>
#include <string_view>
#include <unistd.h>
#include <utility>

namespace nimbra {

namespace {

constexpr std::string_view diagnosticLogsDirectory =
    "/var/mobile/Library/Logs/CrashReporter/DiagnosticLogs";
constexpr std::string_view archiveDirectory =
    "/var/mobile/Library/Logs/CrashReporter/DiagnosticLogs/Stratafile/";
/// Whoever the tool runs as has to be able to write there.
constexpr mode_t archiveDirectoryPermissions = 0777;

constexpr const char* diagnoseTool = "/usr/bin/mrctl";
constexpr const char* sink = "/dev/null";
constexpr mode_t sinkMode = 0666;

/// Of a process's status what is not 0 unless it has exited with 0: the exit code and the signal,
/// without the bit that tells of a core dump.
constexpr int failureBits = 0xff7f;

void replaceAll(std::string& text, std::string_view found, std::string_view replacement) {
    for (std::size_t place = text.find(found); place != std::string::npos;
         place = text.find(found, place + replacement.size())) {
        text.replace(place, found.size(), replacement);
    }
}

/// Leaves the archive's directory empty and for everybody to write to.
std::expected<void, Error> createArchiveDirectory(FileManager& files) {
    const std::string directory(archiveDirectory);
    const auto removed = files.removeItemAtPath(directory);
    const bool isGone = removed || (removed.error().domain == PlatformErrorDomain &&
                                    removed.error().code == FileNoSuchFileError);
    if (!isGone) {
        return removed;
    }
    if (auto created = files.createDirectoryAtPathWithIntermediateDirectoriesAttributes(
            std::string(diagnosticLogsDirectory), true, {});
        !created) {
        return created;
    }
    return files.createDirectoryAtPathWithIntermediateDirectoriesAttributes(
        directory, false, {.posixPermissions = archiveDirectoryPermissions});
}

/// Whether the tool, told to write the archive to `path`, ends and says that it has.
bool runDiagnoseTool(Processes& processes, const std::string& path) {
    SpawnFileActions fileActions;
    fileActions.addopen(STDOUT_FILENO, sink, O_RDWR, sinkMode);
    fileActions.addopen(STDERR_FILENO, sink, O_RDWR, sinkMode);
    const auto process =
        processes.posix_spawn({.path = diagnoseTool,
                               .fileActions = std::move(fileActions),
                               .arguments = {diagnoseTool, "diagnose", "--no-logarchive", path},
                               .environment = std::nullopt});
    if (!process) {
        return false;
    }
    const auto status = processes.waitpid(*process);
    return status && (*status & failureBits) == 0;
}

} // namespace

// A colon for a slash, and apostrophes that stay, are meant: the name is to be recognised.
std::string RSPNimbraDriveViewController::_sanitizeForDiagnoseName(std::string name) {
    constexpr std::array<std::pair<std::string_view, std::string_view>, 5> replacements{
        {{"/", ":"}, {"\"", "'"}, {"`", "'"}, {"\u2019", "'"}, {" ", "_"}}};
    for (const auto& [found, replacement] : replacements) {
        replaceAll(name, found, replacement);
    }
    return name;
}

std::optional<std::string> RSPNimbraDriveViewController::_diagnosePathForMR() const {
    const Text name = services().deviceInfo->copyAnswerForQuestion("UserAssignedDeviceName");
    const auto formatter = services().localization->dateFormatterWithFormat("yy.MM.dd-HH.mm.ss");
    if (const auto created = createArchiveDirectory(services().fileManager); !created) {
        writeLogMessage(services().systemLog, log_messages::failedToCreateDiagnoseDirectory,
                        created.error().line());
        return std::nullopt;
    }
    return std::string(archiveDirectory) + "stratafile-" + _sanitizeForDiagnoseName(name.string()) +
           '-' + formatter->stringFromDate(services().clock->now()).string() + ".tar.gz";
}

std::optional<FileURL> RSPNimbraDriveViewController::_collectMRLogs() const {
    // Twice is meant: the first call only tells whether an archive can be made at all. The second
    // clears the directory once more, and has the time at which the tool starts.
    if (!_diagnosePathForMR()) {
        return std::nullopt;
    }
    const std::optional<std::string> path = _diagnosePathForMR();
    if (!path) {
        return std::nullopt;
    }
    FileURL archive(*path);
    const auto representation = services().fileManager->fileSystemRepresentation(archive);
    if (!representation || !runDiagnoseTool(services().processes, *representation)) {
        return std::nullopt;
    }
    return archive;
}

} // namespace nimbra

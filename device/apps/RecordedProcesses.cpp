#include "device/apps/RecordedProcesses.h"

#include "device/DeviceError.h"
#include "device/apps/Process.h"
#include "device/apps/ProcessRecord.h"
#include "device/files/ApplicationFileName.h"
#include "device/files/FileStamp.h"
#include "device/files/PlainFile.h"
#include "platform/system/SystemLog.h"

#include <cerrno>
#include <csignal>
#include <cstdint>
#include <ctime>
#include <filesystem>
#include <optional>
#include <string>
#include <system_error>
#include <unistd.h>
#include <utility>

namespace nimbra::device {

namespace {

using Nanoseconds = std::chrono::nanoseconds;

Nanoseconds nowBy(clockid_t clock) {
    timespec time{};
    static_cast<void>(::clock_gettime(clock, &time));
    return std::chrono::seconds(time.tv_sec) + Nanoseconds(time.tv_nsec);
}

/// A record's file as it was when it was read.
class RecordFile {
public:
    /// `path` is where it stands on this machine, `devicePath` what messages call it.
    RecordFile(std::filesystem::path path, std::string devicePath)
        : _path(std::move(path)), _devicePath(std::move(devicePath)) {}

    /// Its record; nothing where there is no such file. What is no record is an error.
    [[nodiscard]] std::expected<std::optional<ProcessRecord>, Error> read();
    /// When it was written, as the time since the epoch.
    [[nodiscard]] Nanoseconds written() const { return _stamp.modified; }
    /// Removes it, unless another has come into its place since.
    [[nodiscard]] std::expected<void, Error> remove() const;
    [[nodiscard]] const std::string& devicePath() const { return _devicePath; }

private:
    std::filesystem::path _path;
    std::string _devicePath;
    FileStamp _stamp;
};

std::expected<RecordFile, Error> recordFileOf(const DevicePaths& paths,
                                              const BundleIdentifier& application) {
    const std::string name = applicationFileName(application.string(), ".pid");
    const auto directory = paths.resolve(kRunningApplicationsDirectory);
    if (!directory) {
        return std::unexpected(paths.asTheDeviceSaysIt(directory.error()));
    }
    return RecordFile(*directory / name, std::string(kRunningApplicationsDirectory) + '/' + name);
}

std::expected<std::optional<ProcessRecord>, Error> RecordFile::read() {
    std::error_code failure;
    static_cast<void>(std::filesystem::symlink_status(_path, failure));
    if (failure == std::errc::no_such_file_or_directory || failure == std::errc::not_a_directory ||
        failure == std::errc::filename_too_long) {
        return std::nullopt;
    }
    if (failure) {
        return std::unexpected(fileError(_devicePath, "cannot be read", failure.value()));
    }
    constexpr std::size_t mostBytes = 64;
    const auto file = PlainFile::read(_path, mostBytes, _devicePath);
    if (!file) {
        return std::unexpected(file.error());
    }
    _stamp = file->version.stamp().value_or(FileStamp());
    auto record = ProcessRecord::parse(file->content);
    if (!record) {
        return std::unexpected(
            deviceError(_devicePath + ": expected a process's number and start time, found \"" +
                        file->content + '"'));
    }
    return record;
}

std::expected<void, Error> RecordFile::remove() const {
    if (stampOfPlainFile(_path) == _stamp && ::unlink(_path.c_str()) != 0 && errno != ENOENT) {
        return std::unexpected(fileError(_devicePath, "cannot be removed", errno));
    }
    return {};
}

/// Whether a process that started at `startTime` can be the one of `record`, written at `written`.
bool isRecorded(std::uint64_t startTime, const ProcessRecord& record, Nanoseconds written) {
    const Nanoseconds tick = Nanoseconds(std::chrono::seconds(1)) / ::sysconf(_SC_CLK_TCK);
    const Nanoseconds machineStart = nowBy(CLOCK_REALTIME) - nowBy(CLOCK_BOOTTIME);
    const Nanoseconds started = machineStart + tick * static_cast<std::int64_t>(startTime);
    if (record.startTime) {
        // A start time comes again after a restart of the machine, which records can outlive. Some
        // file systems keep whole seconds only.
        return startTime == *record.startTime && started <= written + std::chrono::seconds(1);
    }
    // The system keeps both times in steps of up to a tick.
    return started <= written + 2 * tick;
}

class EndingProcess final : public EndingApplication {
public:
    EndingProcess(Process process, RecordFile file, SystemLog& log)
        : _process(std::move(process)), _file(std::move(file)), _log(log) {}

    [[nodiscard]] bool awaitEnd(std::chrono::milliseconds longest) override {
        if (!_process.awaitEnd(longest)) {
            return false;
        }
        if (const auto removed = _file.remove(); !removed) {
            _log.write(LogLevel::error, removed.error().description);
        }
        return true;
    }

    void kill() override { static_cast<void>(_process.send(SIGKILL)); }

private:
    Process _process;
    RecordFile _file;
    SystemLog& _log;
};

} // namespace

RecordedProcesses::RecordedProcesses(DevicePaths paths, SystemLog& log)
    : _paths(std::move(paths)), _log(log) {}

std::unique_ptr<EndingApplication>
RecordedProcesses::askToEnd(const BundleIdentifier& application) {
    auto asked = ask(application);
    if (!asked) {
        _log.write(LogLevel::error, asked.error().description);
        return nullptr;
    }
    return std::move(*asked);
}

std::expected<bool, Error> RecordedProcesses::isRunning(const BundleIdentifier& application) const {
    auto file = recordFileOf(_paths, application);
    if (!file) {
        return std::unexpected(file.error());
    }
    const auto record = file->read();
    if (!record) {
        return std::unexpected(record.error());
    }
    if (!*record || (*record)->process < 1) {
        return false;
    }
    const auto process = Process::withNumber((*record)->process);
    const auto startTime = process ? process->startTime() : std::nullopt;
    return startTime && !process->awaitEnd(std::chrono::milliseconds(0)) &&
           isRecorded(*startTime, **record, file->written());
}

std::expected<std::unique_ptr<EndingApplication>, Error>
RecordedProcesses::ask(const BundleIdentifier& application) const {
    auto found = recordFileOf(_paths, application);
    if (!found) {
        return std::unexpected(found.error());
    }
    RecordFile& file = *found;
    const auto read = file.read();
    if (!read) {
        return std::unexpected(read.error());
    }
    const std::optional<ProcessRecord>& record = *read;
    if (!record || record->process <= 1 || record->process == ::getpid()) {
        return nullptr;
    }
    // First the process is held, then it is looked at: what is seen is true of what is held.
    auto process = Process::withNumber(record->process);
    const auto startTime = process ? process->startTime() : std::nullopt;
    const bool hasEnded =
        process ? process->awaitEnd(std::chrono::milliseconds(0)) : process.error() == ESRCH;
    if (hasEnded || (startTime && !isRecorded(*startTime, *record, file.written()))) {
        if (const auto removed = file.remove(); !removed) {
            return std::unexpected(removed.error());
        }
        return nullptr;
    }
    if (!startTime) {
        return nullptr;
    }
    if (const auto sent = process->send(SIGTERM); !sent) {
        if (sent.error() == ESRCH) {
            return nullptr;
        }
        return std::unexpected(
            fileError(file.devicePath(), "its process cannot be asked to end", sent.error()));
    }
    return std::make_unique<EndingProcess>(std::move(*process), std::move(file), _log);
}

} // namespace nimbra::device

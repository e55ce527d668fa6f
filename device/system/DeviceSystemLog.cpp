#include "device/system/DeviceSystemLog.h"

#include "device/DeviceError.h"
#include "device/files/Descriptor.h"

#include <cerrno>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <iostream>
#include <mutex>
#include <spdlog/logger.h>
#include <spdlog/sinks/rotating_file_sink.h>
#include <string>
#include <string_view>
#include <sys/stat.h>
#include <sys/uio.h>
#include <syslog.h>
#include <system_error>
#include <systemd/sd-journal.h>
#include <utility>
#include <vector>

namespace nimbra::device {

namespace {

constexpr auto programName = "nimbra-settings";

int priorityOf(LogLevel level) {
    switch (level) {
    case LogLevel::debug:
        return LOG_DEBUG;
    case LogLevel::standard:
        return LOG_NOTICE;
    case LogLevel::error:
        return LOG_ERR;
    }
    return LOG_ERR;
}

void writeToStandardError(const std::string& line) {
    // One insertion, so that the lines of two threads do not mix.
    std::cerr << std::string(programName) + ": " + line + '\n';
}

/// The system's words in what the library says of a failure: it names the file, but not as its user
/// knows it, and the reason behind it.
std::string reasonIn(const std::string& said) {
    const auto colon = said.rfind(": ");
    return colon == std::string::npos ? said : said.substr(colon + 2);
}

/// Makes the file at `place`, with its folders, as the library would, which does not say why it
/// fails. Gives 0, or the errno.
int makeFile(const std::filesystem::path& place) {
    std::error_code failure;
    std::filesystem::create_directories(place.parent_path(), failure);
    if (failure) {
        return failure.value();
    }
    constexpr mode_t asMasked = 0666;
    // Nobody is waited for where a pipe stands.
    const Descriptor file(::open(place.c_str(),
                                 O_WRONLY | O_APPEND | O_CREAT | O_NONBLOCK | O_NOCTTY | O_CLOEXEC,
                                 asMasked));
    return file.isOpen() ? 0 : errno;
}

} // namespace

/// The log file, made when something is to be written, with its folders.
class DeviceSystemLog::File {
public:
    explicit File(const std::filesystem::path& root)
        : _root(::open(root.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC)) {}

    void write(const DevicePaths& paths, LogLevel level, const std::string& line) {
        const std::scoped_lock lock(_mutex);
        if (!_opened) {
            _opened = true;
            open(paths);
        }
        if (_logger) {
            _logger->log(level == LogLevel::error ? spdlog::level::err : spdlog::level::info, line);
        }
    }

private:
    void open(const DevicePaths& paths) {
        constexpr std::size_t largest = 1024UL * 1024UL;
        constexpr std::size_t earlierFiles = 2;
        const auto path = paths.resolve(kLogFile);
        if (!path) {
            writeToStandardError(path.error().description);
            return;
        }
        // By the directory that was there at the start: the library makes folders that are missing,
        // and one in the place of a device that has been removed meanwhile would come back.
        const auto place = std::filesystem::path("/proc/self/fd") / std::to_string(_root.number()) /
                           path->lexically_relative(paths.root());
        if (const int failure = makeFile(place); failure != 0) {
            writeToStandardError(fileError(*path, "cannot be made", failure).description);
            return;
        }
        try {
            _logger = std::make_unique<spdlog::logger>(
                programName, std::make_shared<spdlog::sinks::rotating_file_sink_mt>(
                                 place.string(), largest, earlierFiles));
        } catch (const spdlog::spdlog_ex& exception) {
            writeToStandardError(
                oneLine(path->string() + ": cannot be opened: " + reasonIn(exception.what())));
            return;
        }
        _logger->set_pattern("%Y-%m-%dT%H:%M:%S.%e%z %v");
        _logger->flush_on(spdlog::level::trace);
        _logger->set_error_handler([name = path->string()](const std::string& said) {
            writeToStandardError(oneLine(name + ": cannot be written: " + reasonIn(said)));
        });
    }

    const Descriptor _root;
    std::mutex _mutex;
    std::unique_ptr<spdlog::logger> _logger;
    bool _opened = false;
};

DeviceSystemLog::Destination DeviceSystemLog::usualDestination() {
    std::error_code absent;
    return std::filesystem::exists("/run/systemd/journal/socket", absent) ? Destination::journal
                                                                          : Destination::file;
}

DeviceSystemLog::DeviceSystemLog(DevicePaths paths, Destination destination)
    : _paths(std::move(paths)), _destination(destination),
      _file(std::make_unique<File>(_paths.root())) {
    const char* const wish = std::getenv("NIMBRA_LOG");
    _debugEnabled = wish != nullptr && std::string_view(wish) == "debug";
}

DeviceSystemLog::~DeviceSystemLog() = default;

bool DeviceSystemLog::isEnabled(LogLevel level) const {
    return level != LogLevel::debug || _debugEnabled;
}

void DeviceSystemLog::write(LogLevel level, const std::string& message) {
    if (!isEnabled(level)) {
        return;
    }
    if (_destination == Destination::journal) {
        writeToJournal(level, message);
        return;
    }
    const std::string line = std::string(nameOf(level)) + ": " + oneLine(message);
    if (level == LogLevel::error && _destination != Destination::fileAlone) {
        writeToStandardError(line);
    }
    _file->write(_paths, level, line);
}

std::vector<std::string> DeviceSystemLog::journalFields(LogLevel level,
                                                        const std::string& message) const {
    return {"MESSAGE=" + oneLine(message), "PRIORITY=" + std::to_string(priorityOf(level)),
            std::string("SYSLOG_IDENTIFIER=") + programName,
            std::string("NIMBRA_LEVEL=") + nameOf(level),
            "NIMBRA_DEVICE=" + _paths.root().string()};
}

void DeviceSystemLog::writeToJournal(LogLevel level, const std::string& message) const {
    std::vector<std::string> fields = journalFields(level, message);
    std::vector<iovec> parts;
    parts.reserve(fields.size());
    for (std::string& field : fields) {
        parts.push_back({.iov_base = field.data(), .iov_len = field.size()});
    }
    if (const int result = ::sd_journal_sendv(parts.data(), static_cast<int>(parts.size()));
        result < 0) {
        writeToStandardError(fileError("journal", "cannot be written", -result).description + ": " +
                             oneLine(message));
    }
}

} // namespace nimbra::device

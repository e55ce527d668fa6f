#pragma once

#include "device/files/DevicePaths.h"
#include "platform/system/SystemLog.h"

#include <memory>
#include <string>
#include <vector>

namespace nimbra::device {

/// The system log of a device. Any thread.
///
/// The lines go to the journal of the machine where it runs one, with the level's name in the
/// field NIMBRA_LEVEL and its priority: debug, notice or error. Elsewhere they go to the device's
/// log file, which is opened for the first line, and those of level error to standard error as
/// well; each line names its level. Debug is enabled only while the environment variable NIMBRA_LOG
/// is "debug".
class DeviceSystemLog final : public SystemLog {
public:
    enum class Destination {
        journal,
        file,
        /// The file, and errors nowhere else.
        fileAlone
    };

    /// The journal where there is one, else the file.
    [[nodiscard]] static Destination usualDestination();

    DeviceSystemLog(DevicePaths paths, Destination destination);
    ~DeviceSystemLog() override;

    [[nodiscard]] bool isEnabled(LogLevel level) const override;
    /// What is not enabled is dropped. A line that cannot be written is told to standard error; a
    /// file that cannot be made is told once, and what goes nowhere else is lost from then on.
    void write(LogLevel level, const std::string& message) override;

    /// What the journal is told of a line: its fields, each "NAME=value".
    [[nodiscard]] std::vector<std::string> journalFields(LogLevel level,
                                                         const std::string& message) const;

private:
    class File;

    void writeToJournal(LogLevel level, const std::string& message) const;

    DevicePaths _paths;
    Destination _destination;
    bool _debugEnabled;
    std::unique_ptr<File> _file;
};

} // namespace nimbra::device

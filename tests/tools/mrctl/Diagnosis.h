#pragma once

#include "device/DeviceDescription.h"
#include "tests/support/ProgramRun.h"
#include "tests/support/TemporaryDirectory.h"

#include <cstdint>
#include <ctime>
#include <filesystem>
#include <map>
#include <nlohmann/json.hpp>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::test {

/// A file or folder in an archive.
struct ArchiveEntry {
    std::string content;
    std::string owner;
    unsigned int permissions = 0;
    std::time_t modified = 0;
};

/// What is in the archive at `path`, by the full names; nothing in one that is damaged.
[[nodiscard]] std::map<std::string, ArchiveEntry> entriesOf(const std::filesystem::path& path);

/// A device to be diagnosed by the real program.
class Diagnosis {
public:
    Diagnosis();

    /// Makes the device.
    void make(const device::DeviceDescription& description) const;

    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    /// A folder for archives.
    [[nodiscard]] std::filesystem::path place() const { return _directory.path() / "archives"; }
    [[nodiscard]] std::filesystem::path archive() const { return place() / "fault.tar.gz"; }

    /// Writes a file of the device.
    void write(const std::string& devicePath, std::string_view content) const;

    /// Runs the program with `arguments` behind the device's root, without any environment.
    [[nodiscard]] ProgramResult run(const std::vector<std::string>& arguments) const;

    /// Diagnoses to `archive` and expects that to work; the files of the archive's folder.
    [[nodiscard]] std::map<std::string, std::string>
    files(const std::vector<std::string>& options = {}) const;
    /// One of `files` that is JSON.
    [[nodiscard]] nlohmann::json json(const std::string& name) const;

    /// The names in the folder for archives.
    [[nodiscard]] std::vector<std::string> namesInPlace() const;

private:
    TemporaryDirectory _directory;
};

} // namespace nimbra::test

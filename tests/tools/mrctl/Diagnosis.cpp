#include "tests/tools/mrctl/Diagnosis.h"

#include "device/DeviceDirectory.h"
#include "tests/device/TestFiles.h"

#include <algorithm>
#include <archive.h>
#include <archive_entry.h>
#include <array>
#include <gtest/gtest.h>

namespace nimbra::test {

std::map<std::string, ArchiveEntry> entriesOf(const std::filesystem::path& path) {
    std::map<std::string, ArchiveEntry> entries;
    archive* const file = ::archive_read_new();
    ::archive_read_support_filter_gzip(file);
    ::archive_read_support_format_tar(file);
    int result = ::archive_read_open_filename(file, path.c_str(), 65536);
    archive_entry* entry = nullptr;
    while (result == ARCHIVE_OK &&
           (result = ::archive_read_next_header(file, &entry)) == ARCHIVE_OK) {
        ArchiveEntry& read = entries[::archive_entry_pathname(entry)];
        read.owner = ::archive_entry_uname(entry);
        read.permissions = ::archive_entry_perm(entry);
        read.modified = ::archive_entry_mtime(entry);
        read.content.resize(static_cast<std::size_t>(::archive_entry_size(entry)));
        if (::archive_read_data(file, read.content.data(), read.content.size()) !=
            static_cast<la_ssize_t>(read.content.size())) {
            result = ARCHIVE_FATAL;
        }
    }
    ::archive_read_free(file);
    return result == ARCHIVE_EOF ? entries : std::map<std::string, ArchiveEntry>();
}

Diagnosis::Diagnosis() {
    std::filesystem::create_directory(place());
}

void Diagnosis::make(const device::DeviceDescription& description) const {
    const auto made = device::createDeviceDirectory(root(), description);
    ASSERT_TRUE(made) << made.error();
}

void Diagnosis::write(const std::string& devicePath, std::string_view content) const {
    writeTestFile(root() / devicePath.substr(1), content);
}

ProgramResult Diagnosis::run(const std::vector<std::string>& arguments) const {
    std::vector<std::string> command{NIMBRA_MRCTL, "--root", root().string()};
    command.insert(command.end(), arguments.begin(), arguments.end());
    return runProgram(command, {});
}

std::map<std::string, std::string> Diagnosis::files(const std::vector<std::string>& options) const {
    std::vector<std::string> arguments{"diagnose", archive().string()};
    arguments.insert(arguments.end(), options.begin(), options.end());
    const ProgramResult result = run(arguments);
    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_EQ(result.messages, "");
    std::map<std::string, std::string> files;
    for (const auto& [name, entry] : entriesOf(archive())) {
        EXPECT_TRUE(name.starts_with("fault/")) << name;
        if (!name.ends_with('/')) {
            files[name.substr(name.find('/') + 1)] = entry.content;
        }
    }
    return files;
}

nlohmann::json Diagnosis::json(const std::string& name) const {
    return nlohmann::json::parse(files().at(name));
}

std::vector<std::string> Diagnosis::namesInPlace() const {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(place())) {
        names.push_back(entry.path().filename());
    }
    std::ranges::sort(names);
    return names;
}

} // namespace nimbra::test

#pragma once

#include <atomic>
#include <cerrno>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

namespace nimbra::test {

/// An empty directory of a test's own, which goes with everything in it.
class TemporaryDirectory {
public:
    TemporaryDirectory() {
        // Of numbers alone: letters by chance may be a word that means something to what is tested.
        static std::atomic<int> count = 0;
        const auto folder = std::filesystem::temp_directory_path();
        do {
            _path = folder /
                    ("nimbra-test." + std::to_string(::getpid()) + '-' + std::to_string(count++));
        } while (::mkdir(_path.c_str(), 0700) != 0 && errno == EEXIST);
        if (!std::filesystem::is_directory(_path)) {
            throw std::runtime_error("no temporary directory");
        }
    }
    TemporaryDirectory(const TemporaryDirectory&) = delete;
    TemporaryDirectory& operator=(const TemporaryDirectory&) = delete;
    ~TemporaryDirectory() {
        std::error_code ignored;
        std::filesystem::remove_all(_path, ignored);
    }

    [[nodiscard]] const std::filesystem::path& path() const { return _path; }

private:
    std::filesystem::path _path;
};

} // namespace nimbra::test

#pragma once

#include <fcntl.h>
#include <filesystem>
#include <gtest/gtest.h>
#include <string>
#include <sys/stat.h>
#include <unistd.h>

namespace nimbra::window {

/// Holds a program of a shell's commands until the test lets it go on.
class Gate {
public:
    /// At `path`, where nothing is.
    explicit Gate(const std::filesystem::path& path) : _path(path.string()) {
        EXPECT_EQ(::mkfifo(_path.c_str(), 0600), 0);
        // With both ends open nobody waits for the other one to come.
        _file = ::open(_path.c_str(), O_RDWR | O_CLOEXEC);
    }
    Gate(const Gate&) = delete;
    Gate& operator=(const Gate&) = delete;
    ~Gate() {
        open();
        ::close(_file);
    }

    /// What the program waits with.
    [[nodiscard]] std::string command() const { return "read line < " + _path; }
    void open() const { EXPECT_EQ(::write(_file, "\n", 1), 1); }

private:
    std::string _path;
    int _file = -1;
};

} // namespace nimbra::window

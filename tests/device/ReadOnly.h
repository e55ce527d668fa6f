#pragma once

#include <filesystem>
#include <gtest/gtest.h>
#include <unistd.h>
#include <utility>

namespace nimbra::test {

/// While it lives, `directory` and what is in it can only be read, also where the tests run as
/// root.
class ReadOnly {
public:
    explicit ReadOnly(std::filesystem::path directory) : _directory(std::move(directory)) {
        permit(false);
        if (::geteuid() == 0) {
            constexpr uid_t nobody = 65534;
            EXPECT_EQ(::seteuid(nobody), 0);
        }
    }
    ReadOnly(const ReadOnly&) = delete;
    ReadOnly& operator=(const ReadOnly&) = delete;
    ~ReadOnly() {
        if (::getuid() == 0) {
            EXPECT_EQ(::seteuid(0), 0);
        }
        permit(true);
    }

private:
    void permit(bool writing) const {
        using std::filesystem::perms;
        const perms write = writing ? perms::owner_write : perms::none;
        const perms read = perms::owner_read | perms::group_read | perms::others_read;
        const perms search = perms::owner_exec | perms::group_exec | perms::others_exec;
        for (const auto& entry : std::filesystem::directory_iterator(_directory)) {
            std::filesystem::permissions(entry.path(), read | write);
        }
        std::filesystem::permissions(_directory, read | search | write);
    }

    std::filesystem::path _directory;
};

} // namespace nimbra::test

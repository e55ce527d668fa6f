#include "tests/tools/mrctl/Diagnosis.h"

#include <algorithm>
#include <cstring>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

namespace nimbra::test {
namespace {

const std::vector<std::string> filesOfADevice{
    "var/lib/nimbra/accounts.db",       "var/lib/nimbra/consent.db",
    "var/lib/nimbra/device-list.json",  "var/lib/nimbra/device.json",
    "var/lib/nimbra/documents.json",    "var/lib/nimbra/preferences/com.example.odd.json",
    "var/lib/nimbra/restrictions.json", "var/log/nimbra/settings.log",
    "run/nimbra/progress/odd.json",     "usr/share/applications/com.example.odd.desktop"};

/// A device on which something stands where `name` should be a file.
class OddFilesTest : public testing::TestWithParam<std::string> {
protected:
    OddFilesTest() {
        _diagnosis.make({});
        std::filesystem::create_directories(path().parent_path());
        std::filesystem::remove(path());
    }

    [[nodiscard]] const Diagnosis& diagnosis() const { return _diagnosis; }
    [[nodiscard]] std::filesystem::path path() const { return _diagnosis.root() / GetParam(); }

    /// Expects one problem more than a plain device has, and the rest of the archive.
    void expectProblem() const {
        const auto files = _diagnosis.files();
        const std::string& problems = files.at("problems.txt");
        std::size_t count = 0;
        for (std::size_t place = 0;
             (place = problems.find(": is not a plain file\n", place)) != std::string::npos;
             ++place) {
            ++count;
        }
        EXPECT_EQ(count, 1U) << problems;
        EXPECT_TRUE(files.contains("versions.json"));
    }

private:
    Diagnosis _diagnosis;
};

TEST_P(OddFilesTest, APipeIsNotWaitedFor) {
    ASSERT_EQ(::mkfifo(path().c_str(), 0644), 0);

    expectProblem();

    const ProgramResult status = diagnosis().run({"status"});
    const bool isNeeded = status.status != 0;
    EXPECT_EQ(std::ranges::count(status.messages, '\n'), isNeeded ? 1 : 0) << status.messages;
    EXPECT_EQ(status.output.empty(), isNeeded);
}

TEST_P(OddFilesTest, ASocketIsNamed) {
    // Its path alone may be too long for an address.
    const int folder = ::open(path().parent_path().c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC);
    const std::string name =
        "/proc/self/fd/" + std::to_string(folder) + '/' + path().filename().string();
    sockaddr_un address{.sun_family = AF_UNIX, .sun_path = {}};
    ASSERT_LT(name.size(), sizeof address.sun_path);
    std::memcpy(&address.sun_path[0], name.c_str(), name.size());
    const int socket = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    ASSERT_EQ(::bind(socket, reinterpret_cast<const sockaddr*>(&address), sizeof address), 0);
    ::close(folder);

    expectProblem();

    ::close(socket);
}

INSTANTIATE_TEST_SUITE_P(Files, OddFilesTest, testing::ValuesIn(filesOfADevice),
                         [](const auto& given) {
                             std::string name =
                                 std::filesystem::path(given.param).filename().string();
                             std::erase_if(name, [](char character) {
                                 return std::string_view(".-").contains(character);
                             });
                             return name;
                         });

TEST(OddFilesOfADeviceTest, AFileThatIsTooLargeIsNamed) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    std::filesystem::resize_file(diagnosis.root() / "var/lib/nimbra/documents.json", 20'000'000);

    const auto files = diagnosis.files();

    EXPECT_TRUE(files.at("problems.txt").contains("documents.json: is larger than "))
        << files.at("problems.txt");
    EXPECT_EQ(diagnosis.run({"status"}).status, 1);
}

TEST(OddFilesOfADeviceTest, TheManifestHasOneLineForEachFileWhateverItsName) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    const std::string folder = "/var/lib/nimbra/preferences/";
    for (const char* const name : {"com.odd\n  false.json  7", "com.odd   false.json  7",
                                   "com.odd\t\t\tfalse.json  7", "com.odd\xff", "com.odd\xfe"}) {
        diagnosis.write(folder + name + ".json", "{}");
    }

    const auto files = diagnosis.files();

    std::vector<std::string> names;
    for (const auto& [name, content] : files) {
        // The names are sentences, and stand as pseudonyms.
        if (name.starts_with("preferences/text-")) {
            names.push_back(name);
            EXPECT_NE(files.at("MANIFEST").find("\n  " + name + "  3  preferences "),
                      std::string::npos)
                << files.at("MANIFEST");
        }
    }
    EXPECT_EQ(names.size(), 5U);
    const std::string& manifest = files.at("MANIFEST");
    const std::string list = manifest.substr(0, manifest.find("\n\n"));
    EXPECT_EQ(static_cast<std::size_t>(std::ranges::count(list, '\n')), files.size() - 1);
}

} // namespace
} // namespace nimbra::test

#include "tests/host/program/Program.h"

#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::test {
namespace {

/// Expects one line that holds `place`, and the exit status of bad input.
void expectOneLine(const ProgramResult& result, const std::string& place) {
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.output, "");
    EXPECT_TRUE(result.messages.starts_with("settingsctl: ")) << result.messages;
    EXPECT_NE(result.messages.find(place), std::string::npos) << result.messages;
    EXPECT_EQ(result.messages.find('\n'), result.messages.size() - 1) << result.messages;
}

/// A device whose file `name` has `content` instead of its own.
class BrokenDevice {
public:
    BrokenDevice(const std::string& name, const std::string& content) {
        EXPECT_EQ(program.run({"init", root.string()}).status, 0);
        EXPECT_TRUE(std::filesystem::exists(root / name)) << name;
        std::ofstream(root / name, std::ios::binary) << content;
    }

    Program program;
    std::filesystem::path root = program.path("device");
};

void expectReportedAndUntouched(const std::string& name, const std::string& content,
                                const std::string& place) {
    const BrokenDevice device(name, content);
    const std::string before = contentsOf(device.root);

    const auto result = device.program.run({"--root", device.root.string(), "list"});

    SCOPED_TRACE(content);
    expectOneLine(result, (device.root / name).string());
    expectOneLine(result, place);
    EXPECT_EQ(contentsOf(device.root), before);
}

TEST(BrokenDevice, ADamagedAccountsDatabaseIsReported) {
    expectReportedAndUntouched("var/lib/nimbra/accounts.db", "no database at all, and long enough",
                               "accounts.db: ");
}

TEST(BrokenDevice, AnUnreadableDescriptionIsReportedWithItsPlace) {
    expectReportedAndUntouched("var/lib/nimbra/device.json", "{", "line 1");
    expectReportedAndUntouched("var/lib/nimbra/device.json", R"({"locale": 4})", "/locale: ");
    expectReportedAndUntouched("var/lib/nimbra/device.json", R"({"colour": 4})", "/colour: ");
    expectReportedAndUntouched("var/lib/nimbra/restrictions.json", "[]", ": /: ");
    expectReportedAndUntouched("var/lib/nimbra/documents.json", R"({"identity": 1})",
                               "/identity: ");
}

TEST(BrokenDevice, ADirectoryThatIsNoDeviceIsReportedAndStaysAsItIs) {
    const Program program;
    program.write("other/file", "mine");
    const std::string before = contentsOf(program.path("other"));

    expectOneLine(program.run({"--root", program.path("other").string(), "list"}),
                  program.path("other").string());
    EXPECT_EQ(contentsOf(program.path("other")), before);
}

TEST(BrokenDevice, AnEmptyDirectoryIsReportedAndStaysEmpty) {
    const Program program;
    std::filesystem::create_directory(program.path("empty"));

    expectOneLine(program.run({"--root", program.path("empty").string(), "list"}),
                  program.path("empty").string());
    EXPECT_TRUE(std::filesystem::is_empty(program.path("empty")));
}

TEST(BrokenDevice, TheShellReportsItToo) {
    const BrokenDevice device("var/lib/nimbra/device.json", "{");

    expectOneLine(device.program.run({"--root", device.root.string(), "shell"}, "list\n"),
                  "device.json");
}

/// A copy of the pane's bundle, to be damaged.
class BundleCopy {
public:
    BundleCopy() {
        std::filesystem::copy(NIMBRA_PANE_BUNDLE, bundle, std::filesystem::copy_options::recursive);
    }

    [[nodiscard]] ProgramResult list() const {
        EXPECT_EQ(program.run({"init", program.path("device").string()}).status, 0);
        return program.run(
            {"--root", program.path("device").string(), "--bundle", bundle.string(), "list"});
    }

    Program program;
    std::filesystem::path bundle = program.path("Copy.bundle");
};

TEST(BrokenBundle, ACopyOfTheBundleServesAsWellAsTheBundle) {
    const BundleCopy copy;

    EXPECT_EQ(copy.list().status, 0);
}

TEST(BrokenBundle, OneThatIsNotThereIsReported) {
    const BundleCopy copy;
    std::filesystem::remove_all(copy.bundle);

    expectOneLine(copy.list(), copy.bundle.string());
}

TEST(BrokenBundle, OneWithoutItsSharedObjectIsReported) {
    const BundleCopy copy;
    std::filesystem::remove(copy.bundle / "NimbraDriveSettings.so");

    expectOneLine(copy.list(), (copy.bundle / "NimbraDriveSettings.so").string());
}

TEST(BrokenBundle, OneWhoseSharedObjectIsCutOffIsReported) {
    const BundleCopy copy;
    const auto object = copy.bundle / "NimbraDriveSettings.so";
    std::filesystem::resize_file(object, std::filesystem::file_size(object) / 8);

    expectOneLine(copy.list(), object.string() + ": the bundle's shared object cannot be loaded: "
                                                 "is cut off");
}

TEST(BrokenBundle, OneWhoseSharedObjectLacksItsEntryPointIsReported) {
    const BundleCopy copy;
    std::filesystem::copy(NIMBRA_EMPTY_OBJECT, copy.bundle / "NimbraDriveSettings.so",
                          std::filesystem::copy_options::overwrite_existing);

    const auto result = copy.list();
    expectOneLine(result, (copy.bundle / "NimbraDriveSettings.so").string());
    expectOneLine(result, "NimbraBundleRegisterClasses");
}

TEST(BrokenBundle, OneWithABrokenManifestIsReported) {
    const BundleCopy copy;
    std::ofstream(copy.bundle / "manifest.json") << R"({"identifier": "a"})";

    expectOneLine(copy.list(), (copy.bundle / "manifest.json").string() + ": /executable: ");
}

TEST(BrokenBundle, OneWithAStringTableThatIsNotJsonIsReported) {
    const BundleCopy copy;
    const auto table = copy.bundle / "de" / "Localizable.json";
    std::ofstream(table) << "CLOUD_DRIVE = Nimbra Drive;";

    expectOneLine(copy.list(), table.string());
}

TEST(DeviceBundle, TheDevicesOwnBundleComesBeforeTheInstalledOne) {
    const Program program;
    const auto root = program.path("device");
    ASSERT_EQ(program.run({"init", root.string()}).status, 0);
    const auto bundles = root / "System/Library/PreferenceBundles/AccountSettings";
    std::filesystem::create_directories(bundles);
    std::filesystem::copy(NIMBRA_TEST_BUNDLE, bundles / "NimbraDriveSettings.bundle",
                          std::filesystem::copy_options::recursive);

    EXPECT_EQ(program.run({"--root", root.string(), "get", "Storage"}).output, "3 apps\n");
    EXPECT_EQ(
        program
            .run({"--root", root.string(), "--bundle", NIMBRA_PANE_BUNDLE, "get", "Nimbra Drive"})
            .output,
        "on\n");
}

} // namespace
} // namespace nimbra::test

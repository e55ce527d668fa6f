#include "tests/host/program/Program.h"

#include <gtest/gtest.h>

namespace nimbra::test {
namespace {

TEST(Init, MakesTheSampleDevice) {
    const Program program;
    const auto device = program.path("new/device");

    const auto result = program.run({"init", device.string()});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, "Made the device \"Nimbra Phone\" in " + device.string() + ".\n");
    EXPECT_EQ(program.run({"--root", device.string(), "get", "Nimbra Drive"}).output, "on\n");
}

TEST(Init, MakesTheDeviceWhereAPathLeadsThroughALink) {
    const Program program;
    std::filesystem::create_directories(program.path("here/below"));
    std::filesystem::create_directory_symlink("here/below", program.path("link"));
    const auto device = program.path("link") / "../device/.";

    const auto result = program.run({"init", device.string()});

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_TRUE(std::filesystem::exists(program.path("here/device/var")));
    EXPECT_FALSE(std::filesystem::exists(program.path("device")));
    EXPECT_EQ(program.run({"--root", device.string(), "get", "Nimbra Drive"}).output, "on\n");
}

TEST(Init, MakesTheDirectoriesAboveTheDevice) {
    const Program program;
    const auto device = program.path("new") / "../beside/./device/";

    const auto result = program.run({"init", device.string()});

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_TRUE(std::filesystem::exists(program.path("beside/device/var")));
    EXPECT_EQ(program.run({"--root", device.string(), "get", "Nimbra Drive"}).output, "on\n");
}

TEST(Init, MakesTheDeviceThatAFileDescribes) {
    const Program program;
    const auto description = program.write(
        "phone.json", R"({"name": "Peter's Phone", "locale": "de-DE", "databaseSettings": null})");
    const auto device = program.path("device");

    const auto result = program.run({"init", device.string(), "--from", description.string()});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, "Made the device \"Peter's Phone\" in " + device.string() + ".\n");
    EXPECT_EQ(result.messages, "");
    EXPECT_NE(program.run({"--root", device.string(), "list"}).output.find("Apps können"),
              std::string::npos);
}

TEST(Init, SaysItInOneLineWhateverTheNameAndThePathHold) {
    const Program program;
    const auto description =
        program.write("phone.json", R"({"name": "a\u001b[31mb\nc\u007f d\r"})");
    const auto device = program.path("x\x1b]0;y\nz");

    const auto result = program.run({"init", device.string(), "--from", description.string()});

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_EQ(result.output,
              "Made the device \"a [31mb c  d \" in " + program.path("x ]0;y z").string() + ".\n");
    EXPECT_TRUE(std::filesystem::exists(device / "var"));
}

TEST(Init, SaysInOneLineWhereASampleDeviceWasMade) {
    const Program program;

    const auto result = program.run({"--root", program.path("x\x1b\ny").string(), "list"});

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_EQ(result.messages,
              "settingsctl: made the sample device in " + program.path("x  y").string() + '\n');
}

TEST(Init, SaysOnceThatNoApplicationRunsOnIt) {
    const Program program;
    const auto description = program.write("phone.json", R"({"apps": [
        {"identifier": "a", "running": true}, {"identifier": "b", "running": true}]})");
    const auto quiet = program.write(
        "quiet.json", R"({"apps": [{"identifier": "a", "running": false}, {"identifier": "b"}]})");

    const auto result =
        program.run({"init", program.path("device").string(), "--from", description.string()});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.messages, "settingsctl: note: /apps: \"running\" has no effect here, "
                               "applications run only while a scenario plays\n");
    EXPECT_EQ(
        program.run({"init", program.path("other").string(), "--from", quiet.string()}).messages,
        "");
}

TEST(Init, RefusesADescriptionWithItsPlaceAndMakesNothing) {
    const Program program;
    const auto description = program.write("phone.json", R"({"locale": 3})");

    const auto result =
        program.run({"init", program.path("device").string(), "--from", description.string()});

    EXPECT_EQ(result.status, 2);
    EXPECT_TRUE(result.messages.starts_with("settingsctl: " + description.string() + ": /locale: "))
        << result.messages;
    EXPECT_FALSE(std::filesystem::exists(program.path("device")));
}

TEST(Init, RefusesADescriptionThatIsTooLarge) {
    const Program program;
    const auto large = program.write("large.json", "");
    std::filesystem::resize_file(large, 64'000'001);

    for (const std::string& file : {large.string(), std::string("/dev/zero")}) {
        const auto result = program.run({"init", program.path("device").string(), "--from", file});

        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.output, "");
        EXPECT_EQ(result.messages, "settingsctl: " + file + ": is larger than 64000000 bytes\n");
        EXPECT_FALSE(std::filesystem::exists(program.path("device")));
    }
}

TEST(Init, SaysThatTheWorkingDirectoryIsGone) {
    const Program program;
    program.write("gone/file", "");

    const auto result = program.runOther(
        {"sh", "-c", "cd \"$1\" && rm -r \"$1\" && exec \"$2\" init phone --from \"$3\"", "sh",
         program.path("gone").string(), NIMBRA_SETTINGSCTL,
         program.write("phone.json", "{}").string()});

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.messages, "settingsctl: phone: cannot be made: No such file or directory\n");
}

TEST(Init, LeavesADirectoryThatIsInUseAsItIs) {
    const Program program;
    program.write("used/file", "mine");
    const std::string before = contentsOf(program.path("used"));

    const auto result = program.run({"init", program.path("used").string()});

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.messages.find('\n'), result.messages.size() - 1);
    EXPECT_EQ(contentsOf(program.path("used")), before);
}

} // namespace
} // namespace nimbra::test

#include "tests/host/program/DeviceProgram.h"

#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

constexpr const char* row = "Look Me Up by Email";
constexpr const char* page =
    "Look Me Up\n"
    "\n"
    "  App Group 1                                                                 on\n"
    "  App Group 2                                                                 on\n"
    "    Who uses one of these groups of apps can find the account database by\n"
    "    its email address.\n";

/// A device with the settings of the cloud database, and commands on it.
class Tessary : public DeviceProgram {
protected:
    Tessary() { init(R"({"numAppGroups": 2})"); }

    void init(const std::string& settings) {
        makeDevice(R"({
            "accounts": [{"identifier": "primary", "primary": true, "usesStratafile": true,
                          "provisioned": ["kAccountDataclassTSYDatabaseService"],
                          "tessaryAccount": "database"}],
            "databaseSettings": )" +
                   settings + "}");
    }
    [[nodiscard]] std::filesystem::path bundle() const {
        return program.path("device") /
               "System/Library/PreferenceBundles/AccountSettings/TessarySettings.bundle";
    }
    void write(const char* name, const std::string& text) const {
        std::filesystem::remove(bundle() / name);
        std::ofstream(bundle() / name) << text;
    }
    /// What the device's own log holds.
    [[nodiscard]] std::string log() const {
        return readWhole(program.path("device") / "var/log/nimbra/settings.log");
    }
    /// Expects that the row is there, empty and without a page, and why.
    void expectNoPage(const std::string& reason) const {
        const auto tapped = run({"tap", row});
        EXPECT_EQ(tapped.status, 1);
        EXPECT_EQ(tapped.output, "");
        // The device's errors are told before.
        EXPECT_TRUE(
            tapped.messages.ends_with("settingsctl: \"" + std::string(row) +
                                      "\" leads to a page that this device does not have\n"))
            << tapped.messages;
        EXPECT_NE(tapped.messages.find(reason), std::string::npos) << tapped.messages;
        EXPECT_EQ(run({"get", row}).output, "\n");
        EXPECT_EQ(run({"get", row}).status, 0);
        EXPECT_NE(log().find("Tessary settings bundle not loaded. Loading..."), std::string::npos);
        EXPECT_NE(log().find(reason), std::string::npos) << log();
    }
};

TEST_F(Tessary, TheRowShowsHowManyGroupsUseTheDatabase) {
    EXPECT_EQ(run({"get", row}).output, "2 apps\n");
    EXPECT_EQ(run({"--locale", "de-DE", "get", "Per E-Mail finden lassen"}).output, "2 Apps\n");
}

TEST_F(Tessary, ATapShowsThePageBehindTheRow) {
    const auto result = run({"tap", row});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, page);
    EXPECT_EQ(result.messages, "");
}

TEST_F(Tessary, InTheShellTheListStaysThePages) {
    const auto result =
        run({"shell"}, std::string("tap ") + row + "\nget App Group 1\nset Nimbra Drive on\n");

    EXPECT_EQ(result.output.find(page), 0U) << result.output;
    EXPECT_NE(result.output.find("~ Nimbra Drive"), std::string::npos);
    EXPECT_NE(result.messages.find("no row \"App Group 1\""), std::string::npos);
}

TEST_F(Tessary, ThePageHasNoRowsWithoutGroupsAndFewOfVeryMany) {
    init(R"({"numAppGroups": -1})");
    EXPECT_EQ(run({"tap", row}).output.find("App Group 1"), std::string::npos);

    init(R"({"numAppGroups": 2147483648})");
    const std::string many = run({"tap", row}).output;
    EXPECT_NE(many.find("App Group 20 "), std::string::npos);
    EXPECT_EQ(many.find("App Group 21 "), std::string::npos);
}

TEST_F(Tessary, TheNumberIsTheOneThatTheBundlesFileHolds) {
    write("app-groups.json", "{\"numAppGroups\":7}");
    EXPECT_EQ(run({"get", row}).output, "7 apps\n");

    for (const char* text :
         {"", "7", "{\"numAppGroups\": seven}", "{\"numAppGroups\": 7", "{\"numAppGroups\": 7} 8",
          "{\"other\": 7}", "{\"numAppGroups\": 9223372036854775808}"}) {
        write("app-groups.json", text);
        EXPECT_EQ(run({"get", row}).output, "\n") << text;
    }
    std::filesystem::remove(bundle() / "app-groups.json");
    EXPECT_EQ(run({"get", row}).output, "\n");
}

TEST_F(Tessary, WithoutTheBundleTheRowLeadsNowhere) {
    std::filesystem::remove_all(bundle());

    expectNoPage("");
}

TEST_F(Tessary, WithoutTheSharedObjectTheRowLeadsNowhere) {
    std::filesystem::remove(bundle() / "TessarySettings.so");

    expectNoPage("Can't load bundle: /System/Library/PreferenceBundles/AccountSettings/"
                 "TessarySettings.bundle/TessarySettings.so: the bundle's shared object cannot "
                 "be loaded: No such file or directory");
}

TEST_F(Tessary, WithAnObjectThatIsNoneTheRowLeadsNowhere) {
    write("TessarySettings.so", "not a shared object, but long enough for a header");

    expectNoPage("TessarySettings.so: the bundle's shared object cannot be loaded: ");
}

TEST_F(Tessary, WithAnObjectThatIsCutOffTheRowLeadsNowhere) {
    std::filesystem::resize_file(bundle() / "TessarySettings.so", 4096);

    expectNoPage("TessarySettings.so: the bundle's shared object cannot be loaded: is cut off");
}

TEST_F(Tessary, WithoutTheEntryPointTheRowLeadsNowhere) {
    std::filesystem::copy_file(NIMBRA_EMPTY_OBJECT, bundle() / "Empty.so");
    write("manifest.json", R"({"identifier": "i", "executable": "Empty.so"})");

    expectNoPage("Empty.so: the bundle's shared object lacks its entry point");
}

TEST_F(Tessary, WithAnEntryPointThatThrowsTheRowLeadsNowhere) {
    std::filesystem::copy_file(NIMBRA_THROWING_OBJECT, bundle() / "Throwing.so");
    write("manifest.json", R"({"identifier": "i", "executable": "Throwing.so"})");

    expectNoPage("Throwing.so: its entry point has thrown: not today");
}

TEST_F(Tessary, WithAnotherBundlesClassesTheRowLeadsNowhere) {
    std::filesystem::copy_file(std::filesystem::path(NIMBRA_TEST_BUNDLE) / "Rows.so",
                               bundle() / "Rows.so");
    write("manifest.json", R"({"identifier": "i", "executable": "Rows.so"})");

    expectNoPage("");
    EXPECT_EQ(log().find("Can't load bundle"), std::string::npos);
}

TEST_F(Tessary, WithANameThatIsTakenTheRowLeadsNowhere) {
    std::filesystem::copy_file(std::filesystem::path(NIMBRA_PANE_BUNDLE) / "NimbraDriveSettings.so",
                               bundle() / "Pane.so");
    write("manifest.json", R"({"identifier": "i", "executable": "Pane.so"})");

    expectNoPage("Pane.so: the name of one of its classes is taken");
}

TEST_F(Tessary, WithAManifestThatIsBrokenTheRowLeadsNowhere) {
    write("manifest.json", "{");

    expectNoPage("Can't load bundle: /System/Library/PreferenceBundles/AccountSettings/"
                 "TessarySettings.bundle/manifest.json: line 1, column 2: not JSON");
}

TEST_F(Tessary, AManifestWithoutAFirstClassIsEnough) {
    write("manifest.json", R"({"identifier": "i", "executable": "TessarySettings.so"})");

    EXPECT_EQ(run({"tap", row}).output, page);
}

} // namespace
} // namespace nimbra::test

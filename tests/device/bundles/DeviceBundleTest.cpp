#include "tests/device/Threads.h"
#include "tests/device/bundles/TestBundles.h"

namespace nimbra::device {
namespace {

class DeviceBundleTest : public BundlesFixture {
protected:
    DeviceBundleTest() {
        makeBundle(folder());
        writeTable("en", R"({"BOTH": "both", "ENGLISH": "only English"})");
        writeTable("de", R"({"BOTH": "beide"})");
        writeTable("de-AT", R"({"AUSTRIA": "nur hier"})");
        writeTable("zh-Hant", R"({"BOTH": "兩者"})");
        writeTable("zh", R"({"BOTH": "两者", "ENGLISH": "简体"})");
        writeTable("en", R"({"BOTH": "other table"})", "Other");
    }

    [[nodiscard]] std::string textFor(const Text& key, const Text& table = "Localizable") {
        return load()->localizedStringForKeyValueTable(key, "MISSING", table).string();
    }
};

TEST_F(DeviceBundleTest, EachKeyFallsBackAlongTheLanguages) {
    settings().overrideLocale("de-AT");
    EXPECT_EQ(textFor("AUSTRIA"), "nur hier");
    EXPECT_EQ(textFor("BOTH"), "beide");
    EXPECT_EQ(textFor("ENGLISH"), "only English");
    EXPECT_EQ(textFor("NOWHERE"), "MISSING");
}

TEST_F(DeviceBundleTest, AChangeOfTheLocaleShowsAtTheNextLookup) {
    EXPECT_EQ(textFor("BOTH"), "both");
    settings().overrideLocale("de-CH");
    EXPECT_EQ(textFor("BOTH"), "beide");
    EXPECT_EQ(textFor("AUSTRIA"), "MISSING");
    settings().overrideLocale("xx");
    EXPECT_EQ(textFor("BOTH"), "both");
}

TEST_F(DeviceBundleTest, AnotherScriptIsNoFallback) {
    settings().overrideLocale("zh-TW");
    EXPECT_EQ(textFor("BOTH"), "兩者");
    EXPECT_EQ(textFor("ENGLISH"), "only English");
    settings().overrideLocale("zh-CN");
    EXPECT_EQ(textFor("ENGLISH"), "简体");
}

TEST_F(DeviceBundleTest, TablesAreKeptApart) {
    EXPECT_EQ(textFor("BOTH", "Other"), "other table");
    EXPECT_EQ(textFor("ENGLISH", "Other"), "MISSING");
    EXPECT_EQ(textFor("BOTH", "None"), "MISSING");
}

TEST_F(DeviceBundleTest, AMissingKeyGivesTheVeryObjectThatWasPassedIn) {
    const Text value("both");

    const Text missing = load()->localizedStringForKeyValueTable("NOWHERE", value, "Localizable");
    const Text found = load()->localizedStringForKeyValueTable("BOTH", value, "Localizable");

    EXPECT_TRUE(missing.isSameObjectAs(value));
    EXPECT_EQ(found, value);
    EXPECT_FALSE(found.isSameObjectAs(value));
}

TEST_F(DeviceBundleTest, AReplacedTableServesEveryLanguageAlone) {
    EXPECT_EQ(textFor("BOTH"), "both");

    load()->replaceTable("Localizable", {{"BOTH", "given"}});

    EXPECT_EQ(textFor("BOTH"), "given");
    EXPECT_EQ(textFor("ENGLISH"), "MISSING");
    EXPECT_EQ(textFor("BOTH", "Other"), "other table");
    settings().overrideLocale("de");
    EXPECT_EQ(textFor("BOTH"), "given");
}

TEST_F(DeviceBundleTest, FilesThatAreNoTablesAreNotRead) {
    test::writeTestFile(folder() / "de/notes.txt", "{");
    test::writeTestFile(folder() / "loose.json", "{");

    EXPECT_EQ(textFor("BOTH"), "both");
}

TEST_F(DeviceBundleTest, ManyThreadsMayLookUpWhileTheLocaleChanges) {
    const auto bundle = load();
    const auto lookUp = [&bundle] {
        for (int round = 0; round < 200; ++round) {
            const Text text =
                bundle->localizedStringForKeyValueTable("BOTH", "MISSING", "Localizable");
            EXPECT_TRUE(text == Text("both") || text == Text("beide"));
        }
    };
    const auto changeLocale = [this] {
        for (int round = 0; round < 50; ++round) {
            settings().overrideLocale(round % 2 == 0 ? "de" : "en");
        }
    };

    test::runAtOnce({lookUp, lookUp, lookUp, changeLocale});
}

} // namespace
} // namespace nimbra::device

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <iterator>
#include <map>
#include <nlohmann/json.hpp>
#include <regex>
#include <set>
#include <string>

namespace nimbra::test {
namespace {

namespace fs = std::filesystem;
using Table = std::map<std::string, std::string>;

const fs::path window = fs::path(NIMBRA_SOURCE_DIR) / "host/qt";

std::string readFile(const fs::path& path) {
    std::ifstream file(path);
    EXPECT_TRUE(file) << path;
    return {std::istreambuf_iterator<char>(file), {}};
}

Table tableOf(const std::string& language) {
    return nlohmann::json::parse(readFile(window / "texts" / (language + ".json"))).get<Table>();
}

/// The code of the window, and its pages.
std::string code() {
    std::string all;
    for (const auto& entry : fs::recursive_directory_iterator(window)) {
        const auto extension = entry.path().extension();
        if (extension == ".cpp" || extension == ".h" || extension == ".qml") {
            all += readFile(entry.path());
        }
    }
    return all;
}

std::set<std::string> matchesOf(const std::regex& pattern, const std::string& text) {
    std::set<std::string> matches;
    for (std::sregex_iterator found(text.begin(), text.end(), pattern), end; found != end;
         ++found) {
        matches.insert(found->str(found->size() - 1));
    }
    return matches;
}

/// "%1" and the like.
std::set<std::string> placeholdersOf(const std::string& text) {
    return matchesOf(std::regex("(%[0-9]*)"), text);
}

TEST(WindowTexts, ThereAreTheLanguagesOfThePage) {
    std::set<std::string> ofPage;
    for (const auto& entry : fs::directory_iterator(NIMBRA_SOURCE_DIR "/resources")) {
        if (entry.is_directory()) {
            ofPage.insert(entry.path().filename());
        }
    }
    std::set<std::string> ofWindow;
    for (const auto& entry : fs::directory_iterator(window / "texts")) {
        ofWindow.insert(entry.path().stem());
    }

    EXPECT_EQ(ofWindow, ofPage);
    EXPECT_THAT(ofWindow, testing::ElementsAre("ar", "de", "en", "fr", "ja"));
}

TEST(WindowTexts, EveryKeyThatTheWindowAsksForHasAText) {
    const auto asked =
        matchesOf(std::regex(R"re(\btext\(\s*(?:QStringLiteral\()?"([^"]*)")re"), code());
    const Table english = tableOf("en");

    // One of the pages, and one of the code.
    EXPECT_THAT(asked, testing::IsSupersetOf({"account", "died"}));
    for (const std::string& key : asked) {
        EXPECT_TRUE(english.contains(key)) << key;
    }
}

TEST(WindowTexts, EveryTextIsOfUse) {
    const std::string all = code();
    for (const auto& [key, text] : tableOf("en")) {
        EXPECT_THAT(all, testing::HasSubstr('"' + key + '"'));
    }
}

class WindowText : public testing::TestWithParam<const char*> {};

TEST_P(WindowText, HasTheKeysOfTheEnglishOneAndNoneTwice) {
    const Table table = tableOf(GetParam());
    std::set<std::string> keys;
    for (const auto& [key, text] : table) {
        keys.insert(key);
        EXPECT_NE(text, "") << key;
    }
    std::set<std::string> english;
    for (const auto& [key, text] : tableOf("en")) {
        english.insert(key);
    }

    EXPECT_EQ(keys, english);
    // What stands twice in a file, a table keeps once.
    const std::string file = readFile(window / "texts" / (std::string(GetParam()) + ".json"));
    EXPECT_EQ(std::ranges::count(file, '\n'), std::ssize(table) + 2);
}

TEST_P(WindowText, HasThePlaceholdersOfTheEnglishOne) {
    Table english = tableOf("en");
    bool hasAny = false;
    for (const auto& [key, text] : tableOf(GetParam())) {
        EXPECT_EQ(placeholdersOf(text), placeholdersOf(english[key])) << key;
        hasAny = hasAny || !placeholdersOf(text).empty();
    }
    EXPECT_TRUE(hasAny);
}

INSTANTIATE_TEST_SUITE_P(Every, WindowText, testing::Values("ar", "de", "en", "fr", "ja"),
                         [](const auto& language) { return std::string(language.param); });

} // namespace
} // namespace nimbra::test

#include "tests/house/TablePattern.h"

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
#include <vector>

namespace nimbra::test {
namespace {

namespace fs = std::filesystem;
using Table = std::map<std::string, std::string>;

std::string readFile(const fs::path& path) {
    std::ifstream file(path);
    EXPECT_TRUE(file) << path;
    return {std::istreambuf_iterator<char>(file), {}};
}

Table tableOf(const std::string& language) {
    const fs::path path = fs::path(NIMBRA_SOURCE_DIR) / "resources" / language / "Localizable.json";
    return nlohmann::json::parse(readFile(path)).get<Table>();
}

std::set<std::string> keysOf(const Table& table) {
    std::set<std::string> keys;
    for (const auto& [key, text] : table) {
        keys.insert(key);
    }
    return keys;
}

/// The sources and headers of the folders in which user texts are named, as far as they exist.
std::vector<fs::path> sourcesWithTexts() {
    std::vector<fs::path> sources;
    for (const char* folder : {"pane", "upgrade", "footer"}) {
        const fs::path place = fs::path(NIMBRA_SOURCE_DIR) / folder;
        if (!fs::exists(place)) {
            continue;
        }
        for (const auto& entry : fs::recursive_directory_iterator(place)) {
            if (entry.path().extension() == ".cpp" || entry.path().extension() == ".h") {
                sources.push_back(entry.path());
            }
        }
    }
    return sources;
}

/// Every key that the code of the pane names, and where: each literal in capitals with an
/// underscore, and each that is handed to a lookup.
std::map<std::string, std::string> keysInCode() {
    const std::regex key(
        R"re((?:ocalized(?:String|Format)\(\s*)"([^"]+)"|"([A-Z0-9]+(?:_[A-Z0-9]+)+)")re");
    std::map<std::string, std::string> keys;
    for (const fs::path& path : sourcesWithTexts()) {
        const std::string source = readFile(path);
        for (std::sregex_iterator found(source.begin(), source.end(), key), end; found != end;
             ++found) {
            keys.emplace((*found)[1].matched ? (*found)[1] : (*found)[2], path.filename());
        }
    }
    return keys;
}

TEST(StringTables, ThereIsOneForEachOfTheFiveLanguages) {
    std::set<std::string> languages;
    for (const auto& entry : fs::directory_iterator(NIMBRA_SOURCE_DIR "/resources")) {
        if (entry.is_directory()) {
            languages.insert(entry.path().filename());
        }
    }

    EXPECT_THAT(languages, testing::ElementsAre("ar", "de", "en", "fr", "ja"));
}

TEST(StringTables, EveryKeyThatTheCodeNamesHasAText) {
    const Table english = tableOf("en");
    const auto keys = keysInCode();

    EXPECT_THAT(keys, testing::Contains(testing::Key("CLOUD_DRIVE")));
    for (const auto& [key, source] : keys) {
        EXPECT_TRUE(english.contains(key)) << key << " in " << source;
    }
}

class StringTable : public testing::TestWithParam<const char*> {};

TEST_P(StringTable, HasTheKeysOfTheEnglishOne) {
    EXPECT_EQ(keysOf(tableOf(GetParam())), keysOf(tableOf("en")));
}

TEST_P(StringTable, HasNoEmptyText) {
    for (const auto& [key, text] : tableOf(GetParam())) {
        EXPECT_NE(text, "") << key;
    }
}

TEST_P(StringTable, HasThePlaceholdersOfTheEnglishOne) {
    Table english = tableOf("en");
    for (const auto& [key, text] : tableOf(GetParam())) {
        const TablePattern pattern = readTablePattern(text);
        EXPECT_EQ(pattern.error, "") << key;
        EXPECT_EQ(pattern.placeholders, readTablePattern(english[key]).placeholders) << key;
    }
}

TEST_P(StringTable, HasATextForEveryPluralCategoryOfItsLanguage) {
    bool hasPlural = false;
    for (const auto& [key, text] : tableOf(GetParam())) {
        for (const auto& [argument, categories] : readTablePattern(text).pluralCategories) {
            EXPECT_EQ(categories, pluralCategoriesOf(GetParam())) << key << ' ' << argument;
            hasPlural = true;
        }
    }
    EXPECT_TRUE(hasPlural);
}

INSTANTIATE_TEST_SUITE_P(Every, StringTable, testing::Values("ar", "de", "en", "fr", "ja"),
                         [](const auto& language) { return std::string(language.param); });

} // namespace
} // namespace nimbra::test

#include <cstddef>
#include <filesystem>
#include <fstream>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <iterator>
#include <map>
#include <regex>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

namespace fs = std::filesystem;
using testing::Contains;
using testing::IsEmpty;
using testing::Key;
using testing::Not;

constexpr const char* identifier = "com.vantrel.settingshost";

fs::path dataFile(const std::string& name) {
    return fs::path(NIMBRA_SOURCE_DIR) / "host/qt/data" / name;
}

std::string contentOf(const fs::path& path) {
    std::ifstream file(path, std::ios::binary);
    EXPECT_TRUE(file) << path;
    return {std::istreambuf_iterator<char>(file), {}};
}

/// What the pattern's two groups match, wherever it does: names and what they stand for.
std::map<std::string, std::string> pairsOf(const std::string& text, const std::string& pattern) {
    const std::regex expression(pattern);
    std::map<std::string, std::string> pairs;
    for (std::sregex_iterator found(text.begin(), text.end(), expression), end; found != end;
         ++found) {
        EXPECT_TRUE(pairs.emplace((*found)[1], (*found)[2]).second) << (*found)[0];
    }
    return pairs;
}

std::map<std::string, std::string> entry() {
    return pairsOf(contentOf(dataFile(std::string(identifier) + ".desktop")),
                   R"((?:^|\n)([A-Za-z\[\]]+)=([^\n]*))");
}

std::string metadata() {
    return contentOf(dataFile(std::string(identifier) + ".metainfo.xml"));
}

/// The languages in which the page has its texts, but for English.
std::vector<std::string> languages() {
    std::vector<std::string> found;
    for (const auto& place : fs::directory_iterator(fs::path(NIMBRA_SOURCE_DIR) / "resources")) {
        if (place.is_directory() && place.path().filename() != "en") {
            found.push_back(place.path().filename());
        }
    }
    EXPECT_THAT(found, Not(IsEmpty()));
    return found;
}

TEST(DesktopEntry, HasANameACommentAndWordsToFindItByInEveryLanguage) {
    const auto lines = entry();

    for (const std::string key : {"Name", "Comment", "Keywords"}) {
        ASSERT_THAT(lines, Contains(Key(key)));
        EXPECT_THAT(lines.at(key), Not(IsEmpty()));
        for (const std::string& language : languages()) {
            const std::string translated = key + '[' + language + ']';
            ASSERT_THAT(lines, Contains(Key(translated)));
            EXPECT_THAT(lines.at(translated), Not(IsEmpty()));
            EXPECT_NE(lines.at(translated), lines.at(key)) << translated;
        }
    }
}

TEST(DesktopEntry, IsCalledLikeItsIconAndItsMetadata) {
    EXPECT_EQ(entry().at("Icon"), identifier);
    EXPECT_THAT(metadata(), testing::HasSubstr("<id>" + std::string(identifier) + "</id>"));
    EXPECT_THAT(metadata(), testing::HasSubstr("<launchable type=\"desktop-id\">" +
                                               std::string(identifier) + ".desktop</launchable>"));
}

TEST(DesktopMetadata, SaysInEveryLanguageWhatTheEntrySays) {
    const auto lines = entry();
    const std::string text = metadata();

    for (const auto& [element, key] :
         std::map<std::string, std::string>{{"name", "Name"}, {"summary", "Comment"}}) {
        const auto english = pairsOf(text, "<(" + element + ")>([^<]*)<");
        ASSERT_THAT(english, Contains(Key(element)));
        EXPECT_EQ(english.at(element), lines.at(key));
        auto translated = pairsOf(text, '<' + element + " xml:lang=\"([^\"]*)\">([^<]*)<");
        for (const std::string& language : languages()) {
            EXPECT_EQ(translated[language], lines.at(key + '[' + language + ']')) << element;
        }
    }
}

TEST(DesktopMetadata, TellsOfThisVersion) {
    EXPECT_THAT(metadata(), testing::HasSubstr("<release version=\"" NIMBRA_VERSION "\""));
}

TEST(DesktopMetadata, DescribesThePageInEveryLanguage) {
    const std::string text = metadata();
    for (const std::string element : {"p", "li"}) {
        const std::regex english('<' + element + ">[^<]+</");
        const auto count = [&](const std::regex& pattern) {
            return std::distance(std::sregex_iterator(text.begin(), text.end(), pattern), {});
        };
        EXPECT_GT(count(english), 0) << element;
        for (const std::string& language : languages()) {
            const std::regex translated('<' + element + " xml:lang=\"" + language + "\">[^<]+</");
            EXPECT_EQ(count(translated), count(english)) << element << ' ' << language;
        }
    }
}

TEST(DesktopIcon, IsAsLargeAsItsNameSays) {
    for (const std::size_t size : {48U, 128U, 256U}) {
        const std::string picture = contentOf(
            dataFile("icons/" + std::string(identifier) + '-' + std::to_string(size) + ".png"));

        // The signature, the length and the name of the first chunk; then width and height.
        ASSERT_GT(picture.size(), 24U);
        EXPECT_EQ(picture.substr(0, 8), "\x89PNG\r\n\x1a\n");
        const auto number = [&](std::size_t place) {
            std::size_t result = 0;
            for (const char byte : picture.substr(place, 4)) {
                result = result * 256 + static_cast<unsigned char>(byte);
            }
            return result;
        };
        EXPECT_EQ(number(16), size);
        EXPECT_EQ(number(20), size);
    }
}

} // namespace
} // namespace nimbra::test

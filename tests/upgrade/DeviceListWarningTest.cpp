#include "tests/upgrade/UpgradeFixture.h"

#include <cstddef>
#include <gmock/gmock.h>
#include <random>

namespace nimbra::test {
namespace {

using Names = std::vector<Text>;

struct DeviceListWarning : UpgradeFixture {
    std::string warning(std::optional<Names> needUpgrade, std::optional<Names> cannotUpgrade) {
        screen->_devicesThatNeedUpgrade = std::move(needUpgrade);
        screen->_devicesThatCannotUpgrade = std::move(cannotUpgrade);
        return marked(screen->_upgradeWarningText());
    }
    [[nodiscard]] std::string list(const std::optional<Names>& names) const {
        const auto text = screen->_commaSeparatedStringWithBoldNamesForDevices(names);
        return text ? marked(*text) : "nothing";
    }
    void removeText(const char* key) {
        auto rest = texts();
        rest.erase(key);
        platform.bundles.paneBundle = std::make_shared<FakeBundle>(rest);
    }
};

TEST_F(DeviceListWarning, WithoutDevicesSaysThatNoneIsKnownAndDescribesNothing) {
    EXPECT_EQ(warning(Names(), Names()), "*[header]*[none known][end]\n");
}

TEST_F(DeviceListWarning, OfAbsentListsIsTheSameAsOfEmptyOnes) {
    EXPECT_EQ(warning(std::nullopt, std::nullopt), "*[header]*[none known][end]\n");
    EXPECT_EQ(warning(Names(), std::nullopt), "*[header]*[none known][end]\n");
    EXPECT_EQ(warning(std::nullopt, Names()), "*[header]*[none known][end]\n");
}

TEST_F(DeviceListWarning, OfOneThatCannotUpgradeHasTheSingularAndTheNameAlone) {
    EXPECT_EQ(warning(Names(), Names{"Old"}), "[short]*[header]*[required][one cannot]#Old#");
    EXPECT_EQ(warning(std::nullopt, Names{"Old"}), "[short]*[header]*[required][one cannot]#Old#");
}

TEST_F(DeviceListWarning, OfSeveralThatCannotUpgradeHasEachNameOnALineOfItsOwn) {
    EXPECT_EQ(warning(Names(), Names{"A", "B", "C"}),
              "[short]*[header]*[required][many cannot]#A\nB\nC#");
}

TEST_F(DeviceListWarning, OfOneToBeUpdatedHasTheSingular) {
    EXPECT_EQ(warning(Names{"New"}, Names()), "*[header]*[one other]*first(New)*[end]\n");
}

TEST_F(DeviceListWarning, OfTwoToBeUpdatedHasThePluralAndTheSeparatorOfTwo) {
    EXPECT_EQ(warning(Names{"A", "B"}, Names()),
              "*[header]*[multiple others]*first(A)* and *B*[end]\n");
}

TEST_F(DeviceListWarning, OfOneOfEachKindEndsWithTheInlineSentence) {
    EXPECT_EQ(warning(Names{"New"}, Names{"Old"}),
              "*[header]*[one other]*first(New)*[end]\n*first(Old)*[it cannot]");
}

TEST_F(DeviceListWarning, OfSeveralOfEachKindHasBothLists) {
    EXPECT_EQ(warning(Names{"A", "B"}, Names{"X", "Y", "Z"}),
              "*[header]*[multiple others]*first(A)* and *B*[end]\n"
              "*first(X)*, *Y*, and *Z*[they cannot]");
    EXPECT_EQ(warning(Names{"A"}, Names{"X", "Y"}),
              "*[header]*[one other]*first(A)*[end]\n*first(X)* and *Y*[they cannot]");
}

TEST_F(DeviceListWarning, OfSeveralToBeUpdatedAndOneThatCannotHasTheSingularInline) {
    EXPECT_EQ(warning(Names{"A", "B"}, Names{"X"}),
              "*[header]*[multiple others]*first(A)* and *B*[end]\n*first(X)*[it cannot]");
}

TEST_F(DeviceListWarning, LooksItsTextsUpFromTopToBottom) {
    platform.bundles.paneBundle = std::make_shared<FakeBundle>(std::map<std::string, Text>());

    static_cast<void>(warning(Names{"A", "B", "C"}, Names{"X"}));

    EXPECT_THAT(missingKeys(),
                testing::ElementsAre(
                    "CLOUD_DRIVE_UPGRADE_NOTE_HEADER",
                    "CLOUD_DRIVE_UPGRADE_WARNING_MULTIPLE_OTHER_DEVICES",
                    "CLOUD_DRIVE_DEVICE_LIST_FIRST_ITEM", "CLOUD_DRIVE_DEVICE_LIST_SEPARATOR",
                    "CLOUD_DRIVE_DEVICE_LIST_LAST_SEPARATOR",
                    "CLOUD_DRIVE_DEVICE_LIST_END_PUNCUATION", "CLOUD_DRIVE_DEVICE_LIST_FIRST_ITEM",
                    "CLOUD_DRIVE_UPGRADE_WARNING_ONE_INELIGIBLE_DEVICE_INLINE"));
}

TEST_F(DeviceListWarning, KeepsTheFontsThatWereTheUsersWhenItWasMade) {
    platform.viewMetrics.bodyPointSize = 20;
    const auto larger = std::make_shared<OpenScreen>(platform.services());
    larger->_devicesThatCannotUpgrade = Names{"Old"};
    platform.viewMetrics.bodyPointSize = 30;

    const AttributedString text = larger->_upgradeWarningText();

    EXPECT_EQ(text.runs().size(), 4U);
    for (const AttributedString::Run& run : text.runs()) {
        EXPECT_EQ(run.attributes.FontAttributeName.pointSize, 20) << run.text;
    }
}

TEST_F(DeviceListWarning, ListsOfEachLengthHaveTheirSeparators) {
    EXPECT_EQ(list(std::nullopt), "nothing");
    EXPECT_EQ(list(Names()), "nothing");
    EXPECT_EQ(list(Names{"A"}), "*first(A)*");
    EXPECT_EQ(list(Names{"A", "B"}), "*first(A)* and *B*");
    EXPECT_EQ(list(Names{"A", "B", "C"}), "*first(A)*, *B*, and *C*");
    EXPECT_EQ(list(Names{"A", "B", "C", "D"}), "*first(A)*, *B*, *C*, and *D*");
}

TEST_F(DeviceListWarning, TheFirstNameIsFormattedWithTheUsersLocale) {
    static_cast<void>(list(Names{"A", "B"}));

    ASSERT_EQ(platform.localization.locales.size(), 1U);
    EXPECT_EQ(platform.localization.locales.front().identifier, "de-DE");
}

TEST_F(DeviceListWarning, SeparatorsAreLookedUpOnceAList) {
    removeText("CLOUD_DRIVE_DEVICE_LIST_SEPARATOR");

    static_cast<void>(list(Names{"A", "B", "C", "D", "E"}));

    EXPECT_EQ(syslog.lines.size(), 1U);
}

TEST_F(DeviceListWarning, NamesStandAsTheyAreInTheOrderGiven) {
    EXPECT_EQ(warning(Names(), Names{" b ", "", "a", "a", "{0} \"x\" 'y'"}),
              "[short]*[header]*[required][many cannot]# b \n\na\na\n{0} \"x\" 'y'#");
    EXPECT_EQ(list(Names{"{1}", "", "z", "z"}), "*first({1})*, , *z*, and *z*");
}

TEST_F(DeviceListWarning, AMissingTextShowsItsStandInAndTheRestAsItIs) {
    removeText("CLOUD_DRIVE_UPGRADE_WARNING_ONE_OTHER_DEVICE");

    EXPECT_EQ(warning(Names{"New"}, Names()),
              "*[header]*RSP_LOCALIZED_STRING_UNAVAILABLE*first(New)*[end]\n");
    EXPECT_EQ(syslog.lines.size(), 1U);
}

TEST_F(DeviceListWarning, WithoutABundleKeepsTheNamesThatNeedNoText) {
    platform.bundles.paneBundle = nullptr;

    EXPECT_EQ(warning(Names(), Names{"A", "B"}), "#A\nB#");
    EXPECT_EQ(warning(Names{"A", "B"}, Names()), "*B*\n");
    EXPECT_TRUE(syslog.lines.empty());
}

TEST_F(DeviceListWarning, IsCentredInTheBodyFontAndItsBoldFace) {
    screen->_devicesThatCannotUpgrade = Names{"Old"};

    const AttributedString text = screen->_upgradeWarningText();

    ASSERT_EQ(text.runs().size(), 4U);
    const ParagraphStyle regular{
        .alignment = TextAlignment::center, .paragraphSpacing = 8, .lineSpacing = -2};
    const ParagraphStyle compact{.alignment = TextAlignment::center};
    const Font body{.pointSize = 17};
    const Font bold{.pointSize = 17, .weight = FontWeight::bold};
    EXPECT_EQ(text.runs()[0].attributes, (TextAttributes{body, regular}));
    EXPECT_EQ(text.runs()[1].attributes, (TextAttributes{bold, regular}));
    EXPECT_EQ(text.runs()[2].attributes, (TextAttributes{body, regular}));
    EXPECT_EQ(text.runs()[3].attributes, (TextAttributes{bold, compact}));
}

/// Names without a character of the texts, so that each is found where it stands only.
Names randomNames(std::mt19937& random) {
    Names names(std::uniform_int_distribution<std::size_t>(0, 6)(random));
    for (Text& name : names) {
        std::string letters;
        const auto length = std::uniform_int_distribution<int>(1, 12)(random);
        for (int index = 0; index < length; ++index) {
            letters += static_cast<char>('A' + std::uniform_int_distribution<int>(0, 25)(random));
        }
        name = Text(letters);
    }
    return names;
}

/// The text piece by piece: whether it is bold, byte by byte.
std::vector<bool> boldness(const AttributedString& text) {
    std::vector<bool> bold;
    for (const AttributedString::Run& run : text.runs()) {
        bold.insert(bold.end(), run.text.size(),
                    run.attributes.FontAttributeName.weight == FontWeight::bold);
    }
    return bold;
}

TEST_F(DeviceListWarning, OfAnyNamesHasThemAllInOrderAndNothingElseBold) {
    std::mt19937 random(6);
    for (int round = 0; round < 500; ++round) {
        const Names needUpgrade = randomNames(random);
        const Names cannotUpgrade = randomNames(random);
        screen->_devicesThatNeedUpgrade = needUpgrade;
        screen->_devicesThatCannotUpgrade = cannotUpgrade;

        const AttributedString text = screen->_upgradeWarningText();
        const std::string plain = text.string();

        // What has to be bold: the header, and the names with what the format puts around the
        // first of a list.
        std::vector<bool> expected(plain.size(), false);
        const auto expectBold = [&](std::size_t place, std::size_t length) {
            for (std::size_t index = place; index < place + length; ++index) {
                expected[index] = true;
            }
        };
        const std::string header = "[header]";
        expectBold(plain.find(header), header.size());
        std::size_t place = plain.find(header) + header.size();
        const bool isStacked = needUpgrade.empty() && !cannotUpgrade.empty();
        for (const Names* names : {&needUpgrade, &cannotUpgrade}) {
            for (std::size_t index = 0; index < names->size(); ++index) {
                const std::string& name = (*names)[index].string();
                const std::string shown = index == 0 && !isStacked ? "first(" + name + ')' : name;
                const std::size_t found = plain.find(shown, place);
                ASSERT_NE(found, std::string::npos) << shown << " in " << plain;
                // The line feeds between stacked names belong to their stretch.
                const std::size_t start = isStacked && index > 0 ? found - 1 : found;
                expectBold(start, found + shown.size() - start);
                place = found + shown.size();
            }
        }
        EXPECT_EQ(boldness(text), expected) << plain;
    }
}

} // namespace
} // namespace nimbra::test

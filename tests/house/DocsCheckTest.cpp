#include "tests/house/Command.h"
#include "tests/house/ScratchTree.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::test {
namespace {

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;

constexpr const char* program = NIMBRA_SOURCE_DIR "/tools/dev/check-docs";

/// What the check says of a document `name` with this content.
std::string saidOf(const std::string& content, const std::string& name = "notes.md") {
    const ScratchTree tree;
    tree.write(name, content);
    const CommandResult result = run({program, NIMBRA_BUILD_DIR, tree.root() / name});
    EXPECT_EQ(result.status, result.output.empty() ? 0 : 1);
    return result.output;
}

#ifdef NIMBRA_EVERYTHING_IS_BUILT
TEST(DocsCheckOfTheProject, EveryCommandOfTheDocumentsWorks) {
    const CommandResult result = run({program, NIMBRA_BUILD_DIR});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, "");
}
#endif

TEST(DocsCheck, WhatWorksAndIsShownAsItIsPasses) {
    EXPECT_EQ(saidOf(R"(# A page

    $ settingsctl get Atlas
    settingsctl: made the sample device in ~/.local/state/nimbra/device
    off
    $ settingsctl set Atlas on
    ~ Atlas ... on
    $ settingsctl list
    Nimbra Drive
    ...
      Budget ... off
    ...
    $ settingsctl get Nothing
    settingsctl: no row "Nothing" ...

Then `settingsctl get Notes`, and in a script:

    settingsctl get Atlas    it is on now,
                             and stays so
    echo \
        "two lines"
    state=$(settingsctl get Atlas)
    [ "$state" = on ]
)"),
              "");
}

TEST(DocsCheck, ACommandThatFailsIsFound) {
    EXPECT_THAT(
        saidOf("Look:\n\n    settingsctl get Atlas\n    settingsctl gte Atlas\n"),
        AllOf(HasSubstr(":4: \"settingsctl gte Atlas\" ends with 2"), Not(HasSubstr(":3:"))));
}

TEST(DocsCheck, AProgramThatIsNotThereIsFound) {
    EXPECT_THAT(saidOf("Look:\n\n    settingsclt list\n"), HasSubstr(":3: \"settingsclt list\""));
}

TEST(DocsCheck, ACommandThatFailsInASentenceOrAFenceIsFound) {
    EXPECT_THAT(saidOf("Call\n`settingsctl get Nothing`.\n\n```sh\nsettingsctl set Atlas\n```\n"),
                AllOf(HasSubstr(":1: \"settingsctl get Nothing\" ends with 1"),
                      HasSubstr(":5: \"settingsctl set Atlas\" ends with 2")));
}

TEST(DocsCheck, AnOutputThatIsNotWhatIsShownIsFound) {
    EXPECT_THAT(saidOf("Look:\n\n    $ echo three words here\n    three words\n"),
                AllOf(HasSubstr(":3: \"echo three words here\" prints something else"),
                      HasSubstr("-three words\n"), HasSubstr("+three words here\n")));
}

TEST(DocsCheck, WhatIsLeftOutIsAPartOfALineOrWholeLines) {
    EXPECT_THAT(saidOf("Look:\n\n    $ printf 'a\\nb\\n'\n    a...b\n"), HasSubstr(":3:"));
    EXPECT_THAT(saidOf("Look:\n\n    $ printf 'ab\\n'\n    a\n    ...\n    b\n"), HasSubstr(":3:"));
}

TEST(DocsCheck, AComplaintThatIsShownHasToBeAFailure) {
    EXPECT_THAT(saidOf("Look:\n\n    $ echo 'mrctl: no'\n    mrctl: no\n"),
                HasSubstr(":3: \"echo 'mrctl: no'\" complains and ends with 0"));
    EXPECT_THAT(saidOf("Look:\n\n    $ echo no; false\n    no\n"),
                HasSubstr(":3: \"echo no; false\" ends with 1"));
}

TEST(DocsCheck, WhatGoesOnUntilItIsInterruptedHasToBegin) {
    EXPECT_EQ(saidOf("Look:\n\n    ./run watch &\n    ./run get Atlas\n"), "");
    EXPECT_THAT(saidOf("Look:\n\n    ./run watch -x &\n    true\n"),
                HasSubstr(":3: \"./run watch -x &\""));
}

TEST(DocsCheck, ABlockOfSomethingElseHasToSayWhatItIs) {
    EXPECT_THAT(saidOf("A drawing:\n\n    ---- | ----\n       none\n\n```\nwords\n```\n"),
                AllOf(HasSubstr(":3: "), HasSubstr(":4: neither a command nor an explanation"),
                      HasSubstr(":6: a fence that does not say what is in it")));
    EXPECT_EQ(saidOf("A drawing:\n\n```text\n---- | ----\n```\n"), "");
}

TEST(DocsCheck, AFenceWithANameIsAFile) {
    EXPECT_EQ(saidOf("```json a.json\n{\"steps\": [{\"do\": \"open\"}]}\n```\n\n"
                     "    settingsctl play a.json\n"),
              "");
    EXPECT_THAT(saidOf("```json a.json\n{\"steps\": [{\"do\": \"oben\"}]}\n```\n\n"
                       "    settingsctl play a.json\n"),
                HasSubstr("/steps/0/do"));
}

TEST(DocsCheck, PlacesAndLinksThatAreNotThereAreFound) {
    EXPECT_EQ(saidOf("In `host/qt/`, `pane/CMakeLists.txt`, [here](notes.md)."), "");
    EXPECT_THAT(saidOf("In `host/tk/`, [here](no.md)."),
                AllOf(HasSubstr(":1: host/tk/ is not there"), HasSubstr(":1: no.md is not there")));
}

TEST(DocsCheck, ADocumentThatIsNotThereIsFound) {
    const CommandResult result = run({program, NIMBRA_BUILD_DIR, "no-such-page.md"});

    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.output, HasSubstr("no-such-page.md: cannot be followed to its end"));
}

TEST(DocsCheck, TheExamplesOfAManualPageAreRun) {
    const std::string page = ".Sh NAME\n.Dl $ false\n.Sh EXAMPLES\n.Dl $ settingsctl get ";
    EXPECT_EQ(saidOf(page + "\\(dqUse Cellular Data\\(dq\n", "notes.1"), "");
    EXPECT_THAT(saidOf(page + "\\(dqUse Data\\(dq\n", "notes.1"),
                HasSubstr(":4: \"settingsctl get \"Use Data\"\" ends with 1"));
}

} // namespace
} // namespace nimbra::test

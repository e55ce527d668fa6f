#include "tests/device/Threads.h"
#include "tests/device/apps/ApplicationsFixture.h"

#include <atomic>

namespace nimbra::device {
namespace {

using ApplicationIndexTest = ApplicationsFixture;

TEST_F(ApplicationIndexTest, EachProblemIsLoggedOnceForEachVersion) {
    const std::string line = "Bad desktop entry: /usr/share/applications/com.a.desktop: line 3: ";
    write("com.a", "Name=A\nX-Nimbra-Entitlements=[]\nnothing\n");
    const Lines first{line + "entitlements: /: expected an object, found [] (and 1 more)"};
    EXPECT_EQ(nameOf("com.a"), "A");
    EXPECT_EQ(nameOf("com.a"), "A");
    EXPECT_TRUE(find("com.a")->entitlements().empty());
    EXPECT_EQ(log(), first);

    settings().overrideLocale("de");
    EXPECT_EQ(nameOf("com.a"), "A");
    EXPECT_EQ(log(), first);

    write("com.a", "Name=A\n[Desktop Entry]\n");
    EXPECT_EQ(nameOf("com.a"), "A");
    EXPECT_EQ(nameOf("com.a"), "A");
    Lines both = first;
    both.push_back(line + "[Desktop Entry] stands here again; the first one counts");
    EXPECT_EQ(log(), both);
}

TEST_F(ApplicationIndexTest, AProblemThatComesBackIsANewOne) {
    for (const int time : {1, 2}) {
        write("com.a", "nothing\nName=A\n");
        EXPECT_EQ(nameOf("com.a"), "A");
        EXPECT_EQ(log().size(), static_cast<std::size_t>(time));
        std::filesystem::remove(file("com.a"));
        EXPECT_EQ(nameOf("com.a"), "none");
    }
}

TEST_F(ApplicationIndexTest, ALinkWhoseTargetComesAndGoesIsFollowedEachTime) {
    std::filesystem::create_symlink("/opt/a.desktop", file("com.a"));
    const std::string line = "Bad desktop entry: /usr/share/applications/com.a.desktop: cannot be "
                             "read: No such file or directory";
    EXPECT_EQ(nameOf("com.a"), "none");
    test::writeTestFile(root() / "opt/a.desktop", "[Desktop Entry]\nName=A\n");
    EXPECT_EQ(nameOf("com.a"), "A");
    std::filesystem::remove(root() / "opt/a.desktop");
    EXPECT_EQ(nameOf("com.a"), "none");
    EXPECT_EQ(log(), (Lines{line, line}));
}

TEST_F(ApplicationIndexTest, TheNameFollowsTheUsersLocale) {
    write("com.a", "Name=Notes\nName[de]=Notizen\nName[sr@latin]=Beleške\nName[zh_TW]=備忘錄\n");
    EXPECT_EQ(nameOf("com.a"), "Notes");
    settings().overrideLocale("de-AT");
    EXPECT_EQ(nameOf("com.a"), "Notizen");
    settings().overrideLocale("sr-Latn-ME");
    EXPECT_EQ(nameOf("com.a"), "Beleške");
    settings().overrideLocale("zh-Hant-HK");
    EXPECT_EQ(nameOf("com.a"), "備忘錄");
}

TEST_F(ApplicationIndexTest, AProxyStaysAsItWas) {
    write("com.a", "Name=Before\n");
    const auto application = find("com.a");
    write("com.a", "Name=After\n");

    EXPECT_EQ(nameOf("com.a"), "After");
    EXPECT_EQ(application->localizedName(), Text("Before"));
}

TEST_F(ApplicationIndexTest, AnEntryOfTheSameLengthWrittenAtOnceIsNoticed) {
    for (int time = 100; time < 400; ++time) {
        const std::string name = std::to_string(time);
        write("com.a", "Name=" + name + '\n');
        ASSERT_EQ(nameOf("com.a"), name);
    }
}

TEST_F(ApplicationIndexTest, AnEntryThatComesOrGoesIsNoticed) {
    EXPECT_EQ(nameOf("com.a"), "none");
    write("com.a", "Name=A\n");
    EXPECT_EQ(nameOf("com.a"), "A");
    std::filesystem::remove(file("com.a"));
    EXPECT_EQ(nameOf("com.a"), "none");
}

TEST_F(ApplicationIndexTest, AFolderThatIsExchangedIsNoticed) {
    write("com.a", "Name=First\n");
    test::writeTestFile(root() / "other/applications/com.a.desktop",
                        "[Desktop Entry]\nName=Other\n");
    EXPECT_EQ(nameOf("com.a"), "First");

    std::filesystem::rename(folder(), root() / "usr/share/away");
    EXPECT_EQ(nameOf("com.a"), "none");

    std::filesystem::create_symlink("/other/applications", folder());
    EXPECT_EQ(nameOf("com.a"), "Other");

    std::filesystem::rename(root() / "usr/share", root() / "usr/away");
    std::filesystem::create_symlink("../other", root() / "usr/share");
    test::writeTestFile(root() / "other/applications/com.a.desktop",
                        "[Desktop Entry]\nName=Changed\n");
    EXPECT_EQ(nameOf("com.a"), "Changed");
    EXPECT_EQ(log(), Lines());
}

TEST_F(ApplicationIndexTest, AnEntryThatStandsAsItWasIsNotReadAgain) {
    // These files have stood here since the tree was made.
    open(DevicePaths(NIMBRA_CORPUS), {"/desktop-entry"});
    const auto application = find("good-plain");
    ASSERT_TRUE(application);
    EXPECT_EQ(application->localizedName(), Text("Notes"));

    EXPECT_EQ(find("good-plain"), application);

    settings().overrideLocale("de");
    const auto again = find("good-plain");
    EXPECT_NE(again, application);
    EXPECT_EQ(find("good-plain"), again);
}

TEST_F(ApplicationIndexTest, ManyThreadsMayAskWhileEntriesChange) {
    write("com.a", "Name=1\n");
    std::atomic<int> unexpected = 0;
    const auto ask = [&] {
        for (int time = 0; time < 300; ++time) {
            const std::string name = nameOf("com.a");
            // A file that is written anew is empty for a moment.
            unexpected += name != "1" && name != "2" && name != "none" && name != "com.a";
            settings().overrideLocale(time % 2 == 0 ? "de" : "en");
        }
    };
    const auto change = [&] {
        for (int time = 0; time < 300; ++time) {
            write("com.a", time % 2 == 0 ? "Name=2\n" : "Name=1\n");
        }
    };

    test::runAtOnce({ask, ask, change});

    EXPECT_EQ(unexpected, 0);
    EXPECT_EQ(nameOf("com.a"), "1");
}

} // namespace
} // namespace nimbra::device

#include "host/core/GroupFooters.h"

#include "platform/system/ClassRegistry.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace nimbra::host {
namespace {

using Calls = std::vector<std::string>;

/// A view that writes down into which windows it moves.
class NotedView final : public HeaderFooterView {
public:
    NotedView(const PlatformServices& services, std::string name, Calls& calls)
        : HeaderFooterView(services, {}), _name(std::move(name)), _calls(calls) {}

    void willMoveToWindow(Window* window) override {
        _calls.push_back(_name + (window != nullptr ? " in" : " out"));
    }
    [[nodiscard]] double preferredHeightForWidthInTableView(double width,
                                                            const Table* /*table*/) const override {
        return width / 10;
    }

private:
    std::string _name;
    Calls& _calls;
};

class GroupFootersTest : public testing::Test {
protected:
    GroupFootersTest() {
        EXPECT_TRUE(_classes.registerHeaderFooterClass(
            {.name = "Noted",
             .initWithSpecifier = [this](const Specifier& group, const PlatformServices& services) {
                 ++_made;
                 return std::make_shared<NotedView>(services, group.identifier().string(), _calls);
             }}));
    }

    [[nodiscard]] static std::shared_ptr<Specifier> group(Text identifier,
                                                          const char* className = "Noted") {
        auto made = Specifier::groupSpecifierWithID(std::move(identifier));
        made->setPropertyForKey(Text(className), FooterCellClassGroupKey);
        return made;
    }

    [[nodiscard]] Calls takeCalls() { return std::exchange(_calls, {}); }

    test::TestPlatform _platform;
    ClassRegistry _classes;
    Calls _calls;
    int _made = 0;
    GroupFooters _footers{_classes, _platform.services(), _platform.systemLog};
};

TEST_F(GroupFootersTest, AGroupThatNamesAClassGetsAViewOfIt) {
    const auto a = group("a");
    const auto plain = Specifier::groupSpecifierWithID("plain");

    _footers.update({plain, a});

    ASSERT_TRUE(_footers.footerOf(*a));
    EXPECT_FALSE(_footers.footerOf(*plain));
    EXPECT_EQ(_footers.first(), _footers.footerOf(*a));
    EXPECT_EQ(takeCalls(), Calls()) << "a page that is not shown has no window";
}

TEST_F(GroupFootersTest, ViewsAreInTheWindowWhileThePageIsShown) {
    const auto a = group("a");
    _footers.update({a});

    _footers.setShown(true);
    _footers.setShown(true);
    EXPECT_EQ(takeCalls(), Calls{"a in"});
    _footers.setShown(false);
    _footers.setShown(false);
    EXPECT_EQ(takeCalls(), Calls{"a out"});
}

TEST_F(GroupFootersTest, AGroupThatComesIntoAShownListEntersTheWindow) {
    const auto a = group("a");
    const auto b = group("b");
    _footers.update({a});
    _footers.setShown(true);
    static_cast<void>(takeCalls());

    _footers.update({a, b});

    EXPECT_EQ(takeCalls(), Calls{"b in"});
}

TEST_F(GroupFootersTest, AGroupThatComesBackHasItsViewAgain) {
    const auto a = group("a");
    _footers.update({a});
    _footers.setShown(true);
    const auto view = _footers.footerOf(*a);

    _footers.update({});
    EXPECT_FALSE(_footers.footerOf(*a));
    EXPECT_FALSE(_footers.first());
    _footers.update({a});

    EXPECT_EQ(_footers.footerOf(*a), view);
    EXPECT_EQ(_made, 1);
    EXPECT_EQ(takeCalls(), (Calls{"a in", "a out", "a in"}));
}

TEST_F(GroupFootersTest, AListThatIsBuiltAnewKeepsTheViewsOfItsGroups) {
    const auto before = group("a");
    const auto after = group("a");
    _footers.update({before});
    _footers.setShown(true);
    const auto view = _footers.footerOf(*before);

    _footers.update({after});

    EXPECT_EQ(_footers.footerOf(*after), view);
    EXPECT_FALSE(_footers.footerOf(*before));
    EXPECT_EQ(takeCalls(), Calls{"a in"});
}

TEST_F(GroupFootersTest, AnotherClassIsAnotherView) {
    EXPECT_TRUE(_classes.registerHeaderFooterClass(
        {.name = "Other",
         .initWithSpecifier = [this](const Specifier& /*group*/, const PlatformServices& services) {
             return std::make_shared<NotedView>(services, "other", _calls);
         }}));
    _footers.update({group("a")});
    _footers.setShown(true);

    _footers.update({group("a", "Other")});

    EXPECT_EQ(takeCalls(), (Calls{"a in", "a out", "other in"}));
}

TEST_F(GroupFootersTest, GroupsWithoutAnIdentifierHaveViewsOfTheirOwn) {
    const auto first = group(nullptr);
    const auto second = group(nullptr);

    _footers.update({first, second});

    EXPECT_EQ(_made, 2);
    EXPECT_NE(_footers.footerOf(*first), _footers.footerOf(*second));
}

TEST_F(GroupFootersTest, AViewThatWasMovedInStaysThereWhenTheListChanges) {
    const auto a = group("a");
    _footers.update({a});
    _footers.moveFirst(true);

    _footers.update({a, group("b")});

    EXPECT_EQ(takeCalls(), Calls{"a in"});
}

TEST_F(GroupFootersTest, TheFirstViewMovesBetweenWindows) {
    const auto a = group("a");
    _footers.update({a});

    _footers.moveFirst(true);
    const Window* first = _footers.first()->window();
    _footers.moveFirst(true);
    EXPECT_NE(_footers.first()->window(), first);
    _footers.moveFirst(false);
    EXPECT_EQ(_footers.first()->window(), nullptr);

    EXPECT_EQ(takeCalls(), (Calls{"a in", "a in", "a out"}));
}

TEST_F(GroupFootersTest, ViewsGetTheWidthOfTheListAndTheHeightThatTheyWant) {
    const auto a = group("a");
    _footers.update({a});

    _footers.layOut(300);

    EXPECT_EQ(_footers.footerOf(*a)->frame(), (Rect{{0, 0}, {300, 30}}));
}

TEST_F(GroupFootersTest, AClassThatNobodyRegisteredIsOneLineInTheLog) {
    const auto a = group("a", "Unheard");

    _footers.update({a});
    _footers.setShown(true);
    _footers.update({a});
    _footers.layOut(300);

    EXPECT_FALSE(_footers.footerOf(*a));
    const test::FakeSystemLog::Lines expected{
        {LogLevel::error, "No view class \"Unheard\" for the group \"a\""}};
    EXPECT_EQ(_platform.systemLog.lines, expected);
}

TEST(GroupFootersEnd, TakesTheViewsOutOfTheWindow) {
    test::TestPlatform platform;
    ClassRegistry classes;
    Calls calls;
    ASSERT_TRUE(classes.registerHeaderFooterClass(
        {.name = "Noted",
         .initWithSpecifier = [&](const Specifier& /*group*/, const PlatformServices& services) {
             return std::make_shared<NotedView>(services, "a", calls);
         }}));
    const auto a = Specifier::groupSpecifierWithID("a");
    a->setPropertyForKey(Text("Noted"), FooterCellClassGroupKey);
    {
        GroupFooters footers(classes, platform.services(), platform.systemLog);
        footers.update({a});
        footers.setShown(true);
    }

    EXPECT_EQ(calls, (Calls{"a in", "a out"}));
}

} // namespace
} // namespace nimbra::host

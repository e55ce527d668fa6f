#include "host/core/DetailPage.h"

#include "platform/system/ClassRegistry.h"
#include "tests/support/TestPlatform.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::host {
namespace {

using testing::ElementsAre;

using Calls = std::vector<std::string>;

/// A page that writes down what happens to it.
class NotedPage final : public SettingsListController {
public:
    NotedPage(const PlatformServices& services, Text title, Calls& calls)
        : SettingsListController(services), _calls(calls) {
        setTitle(std::move(title));
    }
    ~NotedPage() override { _calls.emplace_back("gone"); }

    [[nodiscard]] const SpecifierArray& specifiers() override { return _rows; }
    void viewDidLoad() override {
        SettingsListController::viewDidLoad();
        _calls.push_back("loads behind " + specifier()->name().string());
    }
    void viewDidAppear(bool animated) override {
        SettingsListController::viewDidAppear(animated);
        _calls.emplace_back("appears");
    }
    void viewDidDisappear(bool animated) override {
        SettingsListController::viewDidDisappear(animated);
        _calls.emplace_back("disappears");
    }

private:
    SpecifierArray _rows;
    Calls& _calls;
};

class DetailPageTest : public testing::Test {
protected:
    [[nodiscard]] static std::shared_ptr<Specifier> link(const char* name,
                                                         const ControllerClass* pageClass) {
        return Specifier::preferenceSpecifierNamed(name,
                                                   {.detail = pageClass, .cell = LinkListCell});
    }
    void open(const std::shared_ptr<Specifier>& row) {
        _detail.open(row, _platform.services(), _parent);
    }
    Calls takeCalls() { return std::exchange(_calls, {}); }

    test::TestPlatform _platform;
    Calls _calls;
    Text _title;
    const ControllerClass _pageClass{.name = "Page",
                                     .create =
                                         [this](const PlatformServices& services) {
                                             return std::make_shared<NotedPage>(services, _title,
                                                                                _calls);
                                         },
                                     .classOperations = {}};
    Calls _parentCalls;
    std::shared_ptr<SettingsListController> _parent =
        std::make_shared<NotedPage>(_platform.services(), Text(), _parentCalls);
    DetailPage _detail;
};

TEST_F(DetailPageTest, ShowsThePageOfTheRowsClass) {
    const auto row = link("Link", &_pageClass);

    open(row);

    ASSERT_NE(_detail.page(), nullptr);
    EXPECT_EQ(_detail.page()->specifier(), row);
    EXPECT_EQ(_detail.page()->parentController(), _parent);
    EXPECT_THAT(takeCalls(), ElementsAre("loads behind Link", "appears"));
    EXPECT_TRUE(_parentCalls.empty());
}

TEST_F(DetailPageTest, IsCalledAsThePageOrElseAsItsRow) {
    open(link("Link", &_pageClass));
    EXPECT_EQ(_detail.title(), "Link");

    _title = "Own";
    open(link("Link", &_pageClass));
    EXPECT_EQ(_detail.title(), "Own");
}

TEST_F(DetailPageTest, ThePageGoesWhenTheUserComesBack) {
    open(link("Link", &_pageClass));
    takeCalls();

    _detail.leave();
    _detail.leave();

    EXPECT_EQ(_detail.page(), nullptr);
    EXPECT_THAT(takeCalls(), ElementsAre("disappears", "gone"));
}

TEST_F(DetailPageTest, AnotherPageTakesThePlaceOfTheFirst) {
    open(link("First", &_pageClass));
    takeCalls();

    open(link("Second", &_pageClass));

    EXPECT_THAT(takeCalls(), ElementsAre("disappears", "gone", "loads behind Second", "appears"));
}

TEST_F(DetailPageTest, ARowWithoutAClassOpensNothing) {
    open(link("Link", &_pageClass));

    open(link("Nowhere", nullptr));

    EXPECT_EQ(_detail.page(), nullptr);
}

TEST_F(DetailPageTest, AClassThatMakesNoPageOpensNothing) {
    const ControllerClass withoutPages{.name = "A", .create = nullptr, .classOperations = {}};
    const ControllerClass givesNone{.name = "B",
                                    .create = [](const auto& /*services*/) { return nullptr; },
                                    .classOperations = {}};

    open(link("Link", &withoutPages));
    EXPECT_EQ(_detail.page(), nullptr);
    open(link("Link", &givesNone));
    EXPECT_EQ(_detail.page(), nullptr);
}

} // namespace
} // namespace nimbra::host

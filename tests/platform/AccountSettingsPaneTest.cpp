#include "platform/host/AccountSettingsPane.h"

#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace nimbra {
namespace {

using Calls = std::vector<std::string>;

class EmptyAccountPage : public AccountSettingsPane {
public:
    using AccountSettingsPane::AccountSettingsPane;

    const SpecifierArray& specifiers() override { return _rows; }

private:
    SpecifierArray _rows;
};

/// Writes down which of its buttons was tapped, and does nothing else.
class ButtonPage final : public EmptyAccountPage {
public:
    ButtonPage(const PlatformServices& services, Calls& calls)
        : EmptyAccountPage(services), _calls(calls) {}

    void cancelButtonTapped(const BarButtonItem& sender) override { record("cancel", sender); }
    void doneButtonTapped(const BarButtonItem& sender) override { record("done", sender); }

private:
    void record(const std::string& button, const BarButtonItem& sender) {
        _calls.push_back(button);
        if (sender.systemItem) {
            _calls.back() +=
                *sender.systemItem == BarButtonSystemItem::cancel ? " of cancel" : " of done";
        }
    }

    Calls& _calls;
};

class SavingPage final : public EmptyAccountPage {
public:
    using EmptyAccountPage::EmptyAccountPage;

    void save(const std::shared_ptr<Account>& account) {
        accountOperationsHelper().saveAccountRequireVerification(account, false);
    }
};

struct AccountSettingsPaneTest : testing::Test {
    test::TestPlatform platform;

    static void tap(const std::optional<BarButtonItem>& button) {
        ASSERT_TRUE(button);
        const BarButtonItem item = *button;
        item.action(item);
    }
};

TEST_F(AccountSettingsPaneTest, BeforeTheViewIsLoadedTheBarIsEmpty) {
    const auto page = std::make_shared<EmptyAccountPage>(platform.services());

    EXPECT_FALSE(page->navigationItem().leftBarButtonItem());
    EXPECT_FALSE(page->navigationItem().rightBarButtonItem());
}

TEST_F(AccountSettingsPaneTest, TheBarHasCancelAtTheLeftAndDoneAtTheRight) {
    const auto page = std::make_shared<EmptyAccountPage>(platform.services());

    page->loadViewIfNeeded();

    const auto& left = page->navigationItem().leftBarButtonItem();
    const auto& right = page->navigationItem().rightBarButtonItem();
    ASSERT_TRUE(left);
    EXPECT_EQ(left->systemItem, BarButtonSystemItem::cancel);
    EXPECT_EQ(left->title, Text());
    ASSERT_TRUE(right);
    EXPECT_EQ(right->systemItem, BarButtonSystemItem::done);
    EXPECT_EQ(right->title, Text());
}

TEST_F(AccountSettingsPaneTest, EachButtonTellsThePageThatItWasTapped) {
    const auto page = std::make_shared<ButtonPage>(platform.services(), platform.calls);
    page->loadViewIfNeeded();

    tap(page->navigationItem().leftBarButtonItem());
    tap(page->navigationItem().rightBarButtonItem());

    EXPECT_EQ(platform.calls, Calls({"cancel of cancel", "done of done"}));
}

TEST_F(AccountSettingsPaneTest, ByDefaultEachButtonLeavesThePage) {
    const auto page = std::make_shared<EmptyAccountPage>(platform.services());
    page->loadViewIfNeeded();

    tap(page->navigationItem().leftBarButtonItem());
    EXPECT_EQ(platform.presenter.dismissed, page.get());
    platform.presenter.dismissed = nullptr;
    tap(page->navigationItem().rightBarButtonItem());

    EXPECT_EQ(platform.presenter.dismissed, page.get());
    EXPECT_EQ(platform.calls, Calls({"dismiss itself, animated", "dismiss itself, animated"}));
}

TEST_F(AccountSettingsPaneTest, TheButtonsHoldThePageWeakly) {
    auto page = std::make_shared<ButtonPage>(platform.services(), platform.calls);
    page->loadViewIfNeeded();
    const std::optional<BarButtonItem> left = page->navigationItem().leftBarButtonItem();
    const std::optional<BarButtonItem> right = page->navigationItem().rightBarButtonItem();
    const std::weak_ptr<ButtonPage> seen = page;

    page.reset();
    tap(left);
    tap(right);

    EXPECT_TRUE(seen.expired());
    EXPECT_EQ(platform.calls, Calls());
}

TEST_F(AccountSettingsPaneTest, EverySaveGoesThroughTheOneHelperThatThePageOwns) {
    auto page = std::make_shared<SavingPage>(platform.services());
    const auto account = std::make_shared<test::FakeAccount>("primary");
    auto& store = platform.accountStore;
    EXPECT_EQ(store.delegates.size(), 0U);

    page->save(account);
    page->save(account);

    EXPECT_EQ(store.saves.size(), 2U);
    ASSERT_EQ(store.delegates.size(), 1U);
    EXPECT_EQ(store.delegates.front().lock(), page);
    page.reset();
    EXPECT_TRUE(store.delegates.front().expired()) << "the helper does not keep its page";
}

} // namespace
} // namespace nimbra

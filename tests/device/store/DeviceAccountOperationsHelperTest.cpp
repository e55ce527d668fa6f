#include "device/system/CurrentQueue.h"
#include "tests/device/store/AccountStoreFixture.h"

#include <string>
#include <vector>

namespace nimbra::test {
namespace {

/// Notes what a helper tells, and on which queue.
class RecordingDelegate final : public AccountOperationsHelperDelegate {
public:
    void operationsHelperWillSaveAccount(AccountOperationsHelper& /*helper*/,
                                         const std::shared_ptr<Account>& account) override {
        told.push_back("will save " + account->identifier().string() + " on " +
                       device::currentQueueLabel());
    }
    void operationsHelperDidSaveAccountWithSuccessError(
        AccountOperationsHelper& /*helper*/, const std::shared_ptr<Account>& account,
        const std::expected<void, Error>& saved) override {
        told.push_back((saved ? "did save " : "did not save ") + account->identifier().string() +
                       " on " + device::currentQueueLabel());
    }

    std::vector<std::string> told;
};

struct DeviceAccountOperationsHelperTest : AccountStoreFixture {
    std::unique_ptr<device::DeviceAccountStore> store = openStore();
    std::shared_ptr<Account> account = primaryOf(*store);
    std::shared_ptr<RecordingDelegate> delegate = std::make_shared<RecordingDelegate>();

    /// Waits for the saves that were asked for.
    void finish() { queues->finish(); }
};

using Told = std::vector<std::string>;

TEST_F(DeviceAccountOperationsHelperTest, TheDelegateIsToldBeforeAndAfterOffTheMainQueue) {
    const auto helper = store->operationsHelperWithDelegate(delegate);
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);

    helper->saveAccountRequireVerification(account, false);
    finish();

    EXPECT_EQ(delegate->told, Told({"will save primary on account-operations",
                                    "did save primary on account-operations"}));
    EXPECT_FALSE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
}

TEST_F(DeviceAccountOperationsHelperTest, AFailedSaveIsToldAsSuch) {
    const auto helper = store->operationsHelperWithDelegate(delegate);
    store->planSaveOutcomes({Error{"test", 1, "planned"}});

    helper->saveAccountRequireVerification(account, false);
    finish();

    EXPECT_EQ(delegate->told, Told({"will save primary on account-operations",
                                    "did not save primary on account-operations"}));
}

TEST_F(DeviceAccountOperationsHelperTest, SavesAreMadeOneAfterTheOther) {
    const auto helper = store->operationsHelperWithDelegate(delegate);

    helper->saveAccountRequireVerification(account, false);
    helper->saveAccountRequireVerification(account, false);
    finish();

    ASSERT_EQ(delegate->told.size(), 4U);
    EXPECT_EQ(delegate->told.at(1), "did save primary on account-operations");
    EXPECT_EQ(delegate->told.at(2), "will save primary on account-operations");
}

TEST_F(DeviceAccountOperationsHelperTest, ASaveIsMadeAlsoWhenHelperAndDelegateHaveGone) {
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);
    {
        const auto helper = store->operationsHelperWithDelegate(delegate);
        delegate.reset();
        helper->saveAccountRequireVerification(account, false);
    }
    finish();

    EXPECT_FALSE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
}

TEST_F(DeviceAccountOperationsHelperTest, AVerifiedSaveCompletesOnTheStoresQueue) {
    Told told;
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);

    store->saveVerifiedAccountWithCompletionHandler(account, [&told](const auto& saved) {
        told.push_back((saved ? "saved on " : "failed on ") + device::currentQueueLabel());
    });
    finish();

    EXPECT_EQ(told, Told({"saved on account-store"}));
    EXPECT_FALSE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
}

} // namespace
} // namespace nimbra::test

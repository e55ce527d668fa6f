#pragma once

#include "platform/accounts/AccountStore.h"
#include "tests/support/FakeAccount.h"

#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

/// A store with at most one account, "primary", of which every question gives a fresh copy. A save
/// is under way until the test ends it.
class FakeAccountStore final : public AccountStore {
public:
    using Saved = std::expected<void, Error>;

    [[nodiscard]] std::shared_ptr<Account>
    accountWithIdentifier(const AccountIdentifier& identifier) override {
        asked.push_back(identifier.string());
        onAsked();
        if (!isReadable || identifier.string() != "primary") {
            return nullptr;
        }
        auto account = std::make_shared<FakeAccount>("primary");
        account->flags = stored;
        account->stored = &stored;
        return account;
    }

    void saveVerifiedAccountWithCompletionHandler(const std::shared_ptr<Account>& account,
                                                  SaveCompletion completion) override {
        noteSave(account);
        saves.push_back(
            {.operation = "saveVerifiedAccount", .account = account, .end = std::move(completion)});
    }

    void saveAccount(const std::shared_ptr<Account>& account, SaveOptions options) override {
        noteSave(account);
        saves.push_back({.operation = options.doVerify
                                          ? "saveAccount, with completion, verified"
                                          : "saveAccount, with completion, not verified",
                         .account = account,
                         .end = std::move(options.completion)});
    }

    [[nodiscard]] std::shared_ptr<AccountOperationsHelper>
    operationsHelperWithDelegate(std::weak_ptr<AccountOperationsHelperDelegate> delegate) override {
        delegates.push_back(delegate);
        return std::make_shared<Helper>(*this, std::move(delegate));
    }

    struct Save {
        std::string operation;
        std::shared_ptr<Account> account;
        std::function<void(const Saved&)> end;
    };

    /// Ends the save asked for first, as a queue of the store's would.
    void endSave(const Saved& saved) {
        const Save save = std::move(saves.front());
        saves.erase(saves.begin());
        if (saved) {
            stored = std::static_pointer_cast<FakeAccount>(save.account)->flags;
        }
        save.end(saved);
    }

    /// What the store holds.
    FakeAccount::Flags stored;
    bool isReadable = true;
    /// The identifiers asked for, in order.
    std::vector<std::string> asked;
    /// Called when an account is asked for.
    std::function<void()> onAsked = [] {};
    /// Those for whom helpers were made, in order.
    std::vector<std::weak_ptr<AccountOperationsHelperDelegate>> delegates;
    /// The saves under way, in order.
    std::vector<Save> saves;

    /// What the accounts had when they were given to be saved, in order.
    std::vector<FakeAccount::Flags> given;
    /// Called where an account is given to be saved, to see how things stand then.
    std::function<void()> whenGiven;

private:
    void noteSave(const std::shared_ptr<Account>& account) {
        if (whenGiven) {
            whenGiven();
        }
        if (account) {
            given.push_back(std::static_pointer_cast<FakeAccount>(account)->flags);
        }
    }

    class Helper final : public AccountOperationsHelper {
    public:
        Helper(FakeAccountStore& store, std::weak_ptr<AccountOperationsHelperDelegate> delegate)
            : _store(store), _delegate(std::move(delegate)) {}

        void saveAccountRequireVerification(const std::shared_ptr<Account>& account,
                                            bool requireVerification) override {
            const auto end = [this, account](const Saved& saved) {
                const auto delegate = _delegate.lock();
                delegate->operationsHelperWillSaveAccount(*this, account);
                delegate->operationsHelperDidSaveAccountWithSuccessError(*this, account, saved);
            };
            _store.noteSave(account);
            _store.saves.push_back({.operation = requireVerification ? "saveAccount, verified"
                                                                     : "saveAccount, not verified",
                                    .account = account,
                                    .end = end});
        }

    private:
        FakeAccountStore& _store;
        std::weak_ptr<AccountOperationsHelperDelegate> _delegate;
    };
};

} // namespace nimbra::test

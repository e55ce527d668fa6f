#include "host/core/trace/TracingAccountStore.h"

#include "host/core/trace/SaveTracing.h"
#include "host/core/trace/Trace.h"
#include "host/core/trace/TracingAccount.h"
#include "host/core/trace/TracingOperationsHelper.h"

#include <utility>

namespace nimbra::host {

std::shared_ptr<Account>
TracingAccountStore::accountWithIdentifier(const AccountIdentifier& identifier) {
    _trace.write("fetchAccount", {{"account", identifier.string()}});
    return traced(_store.accountWithIdentifier(identifier));
}

void TracingAccountStore::saveVerifiedAccountWithCompletionHandler(
    const std::shared_ptr<Account>& account, SaveCompletion completion) {
    SaveCompletion traced =
        traceSave("saveVerifiedAccount:withCompletionHandler:", account, std::move(completion));
    _store.saveVerifiedAccountWithCompletionHandler(TracingAccount::original(account),
                                                    std::move(traced));
}

void TracingAccountStore::saveAccount(const std::shared_ptr<Account>& account,
                                      SaveOptions options) {
    options.completion = traceSave("saveAccount:withDataclassActions:doVerify:completion:", account,
                                   std::move(options.completion));
    _store.saveAccount(TracingAccount::original(account), std::move(options));
}

AccountStore::SaveCompletion TracingAccountStore::traceSave(const char* operation,
                                                            const std::shared_ptr<Account>& account,
                                                            SaveCompletion completion) const {
    traceSaveStart(_trace, operation, account);
    return [&trace = _trace, operation, account,
            completion = std::move(completion)](const std::expected<void, Error>& saved) {
        traceSaveEnd(trace, operation, account, saved);
        completion(saved);
    };
}

std::shared_ptr<AccountOperationsHelper> TracingAccountStore::operationsHelperWithDelegate(
    std::weak_ptr<AccountOperationsHelperDelegate> delegate) {
    return TracingOperationsHelper::make(_store, std::move(delegate), _trace);
}

std::shared_ptr<Account> TracingAccountStore::traced(std::shared_ptr<Account> account) const {
    return account ? std::make_shared<TracingAccount>(std::move(account), _trace) : nullptr;
}

} // namespace nimbra::host

#include "host/core/trace/TracingOperationsHelper.h"

#include "host/core/trace/SaveTracing.h"
#include "host/core/trace/TracingAccount.h"
#include "platform/accounts/AccountStore.h"

#include <utility>

namespace nimbra::host {

namespace {

constexpr auto operation = "saveAccount:requireVerification:";

} // namespace

std::shared_ptr<TracingOperationsHelper> TracingOperationsHelper::make(
    AccountStore& store, std::weak_ptr<AccountOperationsHelperDelegate> delegate, Trace& trace) {
    const std::shared_ptr<TracingOperationsHelper> helper(
        new TracingOperationsHelper(std::move(delegate), trace));
    helper->_helper = store.operationsHelperWithDelegate(helper);
    return helper;
}

TracingOperationsHelper::TracingOperationsHelper(
    std::weak_ptr<AccountOperationsHelperDelegate> delegate, Trace& trace)
    : _delegate(std::move(delegate)), _trace(trace) {}

void TracingOperationsHelper::saveAccountRequireVerification(
    const std::shared_ptr<Account>& account, bool requireVerification) {
    traceSaveStart(_trace, operation, account);
    _helper->saveAccountRequireVerification(TracingAccount::original(account), requireVerification);
}

void TracingOperationsHelper::operationsHelperWillSaveAccount(
    AccountOperationsHelper& /*helper*/, const std::shared_ptr<Account>& account) {
    _told = _delegate.lock();
    if (_told) {
        _told->operationsHelperWillSaveAccount(*this,
                                               std::make_shared<TracingAccount>(account, _trace));
    }
}

void TracingOperationsHelper::operationsHelperDidSaveAccountWithSuccessError(
    AccountOperationsHelper& /*helper*/, const std::shared_ptr<Account>& account,
    const std::expected<void, Error>& saved) {
    traceSaveEnd(_trace, operation, account, saved);
    if (const auto delegate = std::exchange(_told, nullptr)) {
        delegate->operationsHelperDidSaveAccountWithSuccessError(
            *this, std::make_shared<TracingAccount>(account, _trace), saved);
    }
}

} // namespace nimbra::host

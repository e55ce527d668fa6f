#include "device/store/DeviceAccountOperationsHelper.h"

#include "device/store/DeviceAccountStore.h"
#include "platform/system/WorkQueue.h"

#include <utility>

namespace nimbra::device {

DeviceAccountOperationsHelper::DeviceAccountOperationsHelper(
    DeviceAccountStore& store, std::shared_ptr<WorkQueue> queue,
    std::weak_ptr<AccountOperationsHelperDelegate> delegate)
    : _store(store), _queue(std::move(queue)), _delegate(std::move(delegate)) {}

void DeviceAccountOperationsHelper::saveAccountRequireVerification(
    const std::shared_ptr<Account>& account, bool /*requireVerification*/) {
    _queue->async([self = shared_from_this(), account] { self->save(account); });
}

void DeviceAccountOperationsHelper::save(const std::shared_ptr<Account>& account) {
    // Held until both have been told, so that who was told of the start is told of the end.
    const auto delegate = _delegate.lock();
    if (delegate) {
        delegate->operationsHelperWillSaveAccount(*this, account);
    }
    const auto saved = _store.save(account);
    if (delegate) {
        delegate->operationsHelperDidSaveAccountWithSuccessError(*this, account, saved);
    }
}

} // namespace nimbra::device

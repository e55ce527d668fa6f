#pragma once

#include "platform/accounts/AccountOperationsHelper.h"

#include <memory>

namespace nimbra {
class WorkQueue;
}

namespace nimbra::device {

class DeviceAccountStore;

/// Saves accounts for one page, one after the other, on a queue of its own. Any thread.
class DeviceAccountOperationsHelper final
    : public AccountOperationsHelper,
      public std::enable_shared_from_this<DeviceAccountOperationsHelper> {
public:
    /// `store` outlives the work of `queue`.
    DeviceAccountOperationsHelper(DeviceAccountStore& store, std::shared_ptr<WorkQueue> queue,
                                  std::weak_ptr<AccountOperationsHelperDelegate> delegate);

    /// A device has no service of its own to ask: an account counts as verified either way.
    void saveAccountRequireVerification(const std::shared_ptr<Account>& account,
                                        bool requireVerification) override;

private:
    void save(const std::shared_ptr<Account>& account);

    DeviceAccountStore& _store;
    std::shared_ptr<WorkQueue> _queue;
    std::weak_ptr<AccountOperationsHelperDelegate> _delegate;
};

} // namespace nimbra::device

#pragma once

#include "platform/accounts/DeviceListRequest.h"

#include <memory>

namespace nimbra {

class Account;

/// Makes questions for the devices of accounts. Main queue.
class DeviceListRequests {
public:
    virtual ~DeviceListRequests() = default;

    /// A question for the devices of `account`, which it shares; of none for null, which is never
    /// answered with a list.
    [[nodiscard]] virtual std::shared_ptr<DeviceListRequest>
    initWithAccount(const std::shared_ptr<Account>& account) = 0;
};

} // namespace nimbra

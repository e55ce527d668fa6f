#pragma once

#include "platform/accounts/DeviceListRequests.h"

#include <memory>

namespace nimbra::host {

class Trace;

/// Traces the requests of another maker, and when they are answered.
class TracingDeviceListRequests final : public DeviceListRequests {
public:
    /// Neither is owned; both outlive this one and the requests made by it.
    TracingDeviceListRequests(DeviceListRequests& requests, Trace& trace)
        : _requests(requests), _trace(trace) {}

    [[nodiscard]] std::shared_ptr<DeviceListRequest>
    initWithAccount(const std::shared_ptr<Account>& account) override;

private:
    DeviceListRequests& _requests;
    Trace& _trace;
};

} // namespace nimbra::host

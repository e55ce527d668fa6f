#pragma once

#include "platform/values/Text.h"

#include <functional>
#include <optional>
#include <vector>

namespace nimbra {

/// What an account's service says of the account's devices, by their names as their users gave
/// them; a list may be absent.
struct DeviceListResponse {
    /// Those that cannot use the new document service at all.
    std::optional<std::vector<Text>> incompatibleDeviceNames;
    /// Those that can use it once their system is updated.
    std::optional<std::vector<Text>> needUpgradeDeviceNames;
};

/// A question for the devices of an account. To be asked once.
class DeviceListRequest {
public:
    /// Gets the request itself, and the answer; none where the service has given none.
    using Handler = std::move_only_function<void(
        const DeviceListRequest& request, const std::optional<DeviceListResponse>& response)>;

    DeviceListRequest() = default;
    DeviceListRequest(const DeviceListRequest&) = delete;
    DeviceListRequest& operator=(const DeviceListRequest&) = delete;
    virtual ~DeviceListRequest() = default;

    /// Asks, and returns at once. `handler` is called once, on a thread of the request's choosing,
    /// and let go after that; one that is never answered is let go when the platform ends. The
    /// request may be let go before. Main queue.
    virtual void performRequestWithHandler(Handler handler) = 0;
};

} // namespace nimbra

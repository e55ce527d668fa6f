#pragma once

#include "platform/accounts/DeviceListRequests.h"

#include <functional>
#include <memory>
#include <optional>
#include <utility>
#include <vector>

namespace nimbra::test {

/// Requests that are answered when a test says so, or never.
class FakeDeviceListRequests final : public DeviceListRequests {
public:
    [[nodiscard]] std::shared_ptr<DeviceListRequest>
    initWithAccount(const std::shared_ptr<Account>& account) override {
        accounts.push_back(account);
        onRequest();
        return std::make_shared<Request>(handlers);
    }

    /// Answers the request that was made first and not answered, on the calling thread, and lets
    /// its handler go.
    void answer(const std::optional<DeviceListResponse>& response) {
        DeviceListRequest::Handler handler = std::move(handlers.front());
        handlers.erase(handlers.begin());
        handler(Request(handlers), response);
    }

    /// Called when a request is made.
    std::function<void()> onRequest = [] {};
    /// The accounts whose devices were asked for, in order.
    std::vector<std::shared_ptr<Account>> accounts;
    /// Of the requests that wait for an answer, in order.
    std::vector<DeviceListRequest::Handler> handlers;

private:
    class Request final : public DeviceListRequest {
    public:
        explicit Request(std::vector<Handler>& handlers) : _handlers(handlers) {}
        void performRequestWithHandler(Handler handler) override {
            _handlers.push_back(std::move(handler));
        }

    private:
        std::vector<Handler>& _handlers;
    };
};

} // namespace nimbra::test

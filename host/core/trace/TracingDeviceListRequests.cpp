#include "host/core/trace/TracingDeviceListRequests.h"

#include "host/core/trace/Trace.h"
#include "host/core/trace/TracingAccount.h"

#include <utility>

namespace nimbra::host {

namespace {

class TracingRequest final : public DeviceListRequest {
public:
    TracingRequest(std::shared_ptr<DeviceListRequest> request, nlohmann::ordered_json account,
                   Trace& trace)
        : _request(std::move(request)), _account(std::move(account)), _trace(trace) {}

    void performRequestWithHandler(Handler handler) override {
        _trace.write("deviceList", {{"op", "request"}, {"account", _account}});
        _request->performRequestWithHandler(
            [&trace = _trace, account = _account, handler = std::move(handler)](
                const DeviceListRequest& request,
                const std::optional<DeviceListResponse>& response) mutable {
                trace.write("deviceList", {{"op", "response"}, {"account", account}});
                handler(request, response);
            });
    }

private:
    std::shared_ptr<DeviceListRequest> _request;
    nlohmann::ordered_json _account;
    Trace& _trace;
};

} // namespace

std::shared_ptr<DeviceListRequest>
TracingDeviceListRequests::initWithAccount(const std::shared_ptr<Account>& account) {
    return std::make_shared<TracingRequest>(
        _requests.initWithAccount(TracingAccount::original(account)), identifierOf(account),
        _trace);
}

} // namespace nimbra::host

#pragma once

#include "device/accounts/DeviceListFile.h"
#include "platform/accounts/DeviceListRequests.h"

#include <memory>

namespace nimbra {
class WorkQueues;
}

namespace nimbra::device {

/// Answers questions for the devices of accounts out of the device's `device-list.json`, read when
/// the answer is given, on the queue "device-list". Where the file cannot be read, says that the
/// service fails, or the account is null, there is no list in the answer. Main queue.
class DeviceListService final : public DeviceListRequests {
public:
    /// `queues` are not owned and outlive the service; their work has ended before the service
    /// goes.
    DeviceListService(DeviceListFile file, WorkQueues& queues);
    DeviceListService(const DeviceListService&) = delete;
    DeviceListService& operator=(const DeviceListService&) = delete;
    /// Ends the answers as `finish` does.
    ~DeviceListService() override;

    [[nodiscard]] std::shared_ptr<DeviceListRequest>
    initWithAccount(const std::shared_ptr<Account>& account) override;

    /// Answers nothing from here on: the handlers that have not been called, whether their answer
    /// is on its way or never comes, are let go on the calling thread. One that just runs runs to
    /// its end on its queue.
    void finish();

private:
    class Questions;
    class Request;

    std::shared_ptr<Questions> _questions;
};

} // namespace nimbra::device

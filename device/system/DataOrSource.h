#pragma once

#include "platform/system/EventSource.h"
#include "platform/system/WorkQueue.h"

#include <memory>

namespace nimbra::device {

/// The source of kind data-or over any queue. Any thread.
class DataOrSource final : public DataOrEventSource {
public:
    /// A suspended source whose handler runs on `queue`.
    explicit DataOrSource(std::shared_ptr<WorkQueue> queue);

    void setEventHandler(std::function<void()> handler) override;
    void resume() override;
    void mergeData(std::uintptr_t value) override;

private:
    struct State;

    void callHandlerSoon();

    std::shared_ptr<WorkQueue> _queue;
    std::shared_ptr<State> _state;
};

} // namespace nimbra::device

#pragma once

#include <string>

namespace nimbra::device {

/// The label of the queue whose work the calling thread runs, or "other" for a thread that is no
/// queue's.
[[nodiscard]] const std::string& currentQueueLabel();

/// While it lives, the calling thread runs the work of the queue called `label`, which outlives it.
class CurrentQueueScope {
public:
    explicit CurrentQueueScope(const std::string& label);
    CurrentQueueScope(const CurrentQueueScope&) = delete;
    CurrentQueueScope& operator=(const CurrentQueueScope&) = delete;
    ~CurrentQueueScope();

private:
    const std::string* _outer;
};

} // namespace nimbra::device

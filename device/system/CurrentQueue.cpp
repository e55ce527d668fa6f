#include "device/system/CurrentQueue.h"

namespace nimbra::device {

namespace {

thread_local const std::string* currentLabel = nullptr;

} // namespace

const std::string& currentQueueLabel() {
    static const std::string other = "other";
    return currentLabel != nullptr ? *currentLabel : other;
}

CurrentQueueScope::CurrentQueueScope(const std::string& label) : _outer(currentLabel) {
    currentLabel = &label;
}

CurrentQueueScope::~CurrentQueueScope() {
    currentLabel = _outer;
}

} // namespace nimbra::device

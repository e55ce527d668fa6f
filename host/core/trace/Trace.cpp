#include "host/core/trace/Trace.h"

#include "device/system/CurrentQueue.h"

namespace nimbra::host {

void Trace::write(std::string_view event, const Keys& keys) {
    nlohmann::ordered_json object;
    object["event"] = event;
    object["queue"] = device::currentQueueLabel();
    for (const auto& [key, value] : keys) {
        object[std::string(key)] = value;
    }
    const std::string line =
        object.dump(-1, ' ', false, nlohmann::ordered_json::error_handler_t::replace);
    const std::scoped_lock lock(_mutex);
    if (!_hasEnded) {
        _sink(line);
    }
}

void Trace::end() {
    const std::scoped_lock lock(_mutex);
    _hasEnded = true;
}

nlohmann::ordered_json jsonOf(const Error& error) {
    return {{"domain", error.domain}, {"code", error.code}, {"description", error.description}};
}

} // namespace nimbra::host

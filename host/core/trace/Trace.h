#pragma once

#include "platform/values/Error.h"

#include <functional>
#include <mutex>
#include <nlohmann/json.hpp>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace nimbra::host {

/// What a pane does to its host and to the platform, as one JSON object a line, in the order in
/// which it happens. Any thread.
class Trace {
public:
    /// Takes one line, without its end; called by one thread at a time.
    using Sink = std::function<void(const std::string& line)>;
    using Keys = std::vector<std::pair<std::string_view, nlohmann::ordered_json>>;

    explicit Trace(Sink sink) : _sink(std::move(sink)) {}

    /// Writes that `event` happens now on the calling thread's queue; `keys` follow in this order.
    /// Text that is not UTF-8 is written with replacement characters.
    void write(std::string_view event, const Keys& keys);

    /// What happens from now on is no longer written.
    void end();

private:
    std::mutex _mutex;
    Sink _sink;
    bool _hasEnded = false;
};

/// `error` as traces have it.
[[nodiscard]] nlohmann::ordered_json jsonOf(const Error& error);

} // namespace nimbra::host

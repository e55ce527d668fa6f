#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <sys/types.h>

namespace nimbra::device {

/// What the device keeps of a running application: which process it is.
struct ProcessRecord {
    pid_t process = 0;
    /// When the process started, in clock ticks since the machine did: a number alone goes to
    /// another process sooner or later. Absent where whoever started the application did not say.
    std::optional<std::uint64_t> startTime;

    /// The record in `content`: a number, and behind a blank the start time. Nothing where that is
    /// not what stands there.
    [[nodiscard]] static std::optional<ProcessRecord> parse(std::string_view content);
    /// The same as one line of a file.
    [[nodiscard]] std::string text() const;

    friend bool operator==(const ProcessRecord&, const ProcessRecord&) = default;
};

} // namespace nimbra::device

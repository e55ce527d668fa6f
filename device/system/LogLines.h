#pragma once

#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <cstddef>
#include <expected>
#include <string>
#include <vector>

namespace nimbra::device {

/// The newest lines of the device's log file and of those that it replaced, the oldest first, at
/// most `most`. Each is one line whatever it was written as. Of a file that is far larger than the
/// log lets one grow only the end is read, and a line in the place of the rest says how much is
/// missing. An error where the device keeps no log file, as where its lines go to the journal, or
/// where one cannot be read. Any thread.
[[nodiscard]] std::expected<std::vector<std::string>, Error>
newestLogLines(const DevicePaths& paths, std::size_t most);

} // namespace nimbra::device

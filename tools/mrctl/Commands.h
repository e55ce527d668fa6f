#pragma once

#include "platform/values/Error.h"
#include "tools/mrctl/Arguments.h"

#include <expected>
#include <iosfwd>

namespace nimbra::mrctl {

/// Does what `arguments` ask for; what is to be read goes to `output`. The device is only read.
[[nodiscard]] std::expected<void, Error> run(const Arguments& arguments, std::ostream& output);

} // namespace nimbra::mrctl

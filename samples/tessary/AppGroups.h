#pragma once

#include <cstdint>
#include <optional>

namespace nimbra::samples {

/// How many groups of applications use the cloud database: the number under "numAppGroups" in the
/// file app-groups.json beside this code, as it stands there now. Nothing where there is none.
[[nodiscard]] std::optional<std::int64_t> numberOfAppGroups();

} // namespace nimbra::samples

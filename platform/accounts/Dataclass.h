#pragma once

#include "platform/values/Identifier.h"

namespace nimbra {

/// Cloud-document storage: what the master switch turns on and off.
inline const Dataclass kAccountDataclassTidewater{"kAccountDataclassTidewater"};

} // namespace nimbra

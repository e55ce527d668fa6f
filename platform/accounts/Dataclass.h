#pragma once

#include "platform/values/Identifier.h"

namespace nimbra {

/// Cloud-document storage: what the master switch turns on and off.
inline const Dataclass kAccountDataclassTidewater{"kAccountDataclassTidewater"};
/// The photo stream, which cannot do without document storage.
inline const Dataclass kAccountDataclassLarder{"kAccountDataclassLarder"};
/// Key-value storage, which uses cellular data together with document storage.
inline const Dataclass kAccountDataclassKeyValue{"kAccountDataclassKeyValue"};
/// The cloud database: its records, its devices, what is shared of it.
inline const Dataclass kAccountDataclassTSYDatabaseService{"kAccountDataclassTSYDatabaseService"};
inline const Dataclass kAccountDataclassTSYDeviceService{"kAccountDataclassTSYDeviceService"};
inline const Dataclass kAccountDataclassTSYShareService{"kAccountDataclassTSYShareService"};

} // namespace nimbra

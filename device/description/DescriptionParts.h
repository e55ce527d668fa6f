#pragma once

#include "device/DeviceDescription.h"

namespace nimbra::device {

class JsonReader;

// Reading the parts of a device's description: each takes the reader of its part's value, notes
// there what is not as it should be, and leaves what is not given as `description` has it.

void readScreen(const JsonReader& reader, DeviceDescription& description);
void readPreferences(const JsonReader& reader, DeviceDescription& description);
void readRestrictions(const JsonReader& reader, DeviceDescription& description);
void readAccounts(const JsonReader& reader, DeviceDescription& description);
void readApplications(const JsonReader& reader, DeviceDescription& description);
void readConsent(const JsonReader& reader, DeviceDescription& description);
void readDocuments(const JsonReader& reader, DeviceDescription& description);
void readDeviceList(const JsonReader& reader, DeviceDescription& description);
void readDatabaseSettings(const JsonReader& reader, DeviceDescription& description);
void readTool(const JsonReader& reader, DeviceDescription& description);
void readStrings(const JsonReader& reader, DeviceDescription& description);
void readFaults(const JsonReader& reader, DeviceDescription& description);

/// The members `incompatible` and `needUpgrade` of the object at `reader`.
void readDeviceNames(const JsonReader& reader, DeviceDescription& description);
/// The members `name`, `idiom`, `screen`, `locale` and `timeZone` of the object at `reader`.
void readDeviceFacts(const JsonReader& reader, DeviceDescription& description);
/// The members `cellularData` and `wirelessVariant` of the object at `reader`.
void readAbilities(const JsonReader& reader, DeviceDescription& description);

} // namespace nimbra::device

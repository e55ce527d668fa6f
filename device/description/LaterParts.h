#pragma once

namespace nimbra::device {

class JsonReader;

// Parts of a device's description that nothing on the device uses yet: they are checked, so that a
// description is right or wrong whatever the version that reads it.

void checkTool(const JsonReader& reader);
/// Of the faults only those that no service uses yet.
void checkFaults(const JsonReader& reader);

} // namespace nimbra::device

#include "tools/mrctl/Versions.h"

#include "device/store/Database.h"
#include "tools/mrctl/ArchiveFile.h"

#include <string>
#include <sys/utsname.h>

namespace nimbra::mrctl {

namespace {

using Json = nlohmann::ordered_json;

Json orNull(const std::optional<std::int64_t>& version) {
    return version ? Json(*version) : Json(nullptr);
}

} // namespace

Json versionsOf(const DeviceContents& contents) {
    // Not the node's name: it is the device's.
    utsname kernel{};
    static_cast<void>(::uname(&kernel));
    const std::string json = std::to_string(NLOHMANN_JSON_VERSION_MAJOR) + '.' +
                             std::to_string(NLOHMANN_JSON_VERSION_MINOR) + '.' +
                             std::to_string(NLOHMANN_JSON_VERSION_PATCH);
    return Json{{"mrctl", NIMBRA_VERSION},
                {"databases", Json{{"accounts", orNull(contents.accountsVersion)},
                                   {"consent", orNull(contents.consentVersion)}}},
                {"kernel", Json{{"name", std::string(&kernel.sysname[0])},
                                {"release", std::string(&kernel.release[0])},
                                {"machine", std::string(&kernel.machine[0])}}},
                {"libraries", Json{{"archive", ArchiveFile::libraryVersion()},
                                   {"json", json},
                                   {"sqlite", device::Database::libraryVersion()}}}};
}

} // namespace nimbra::mrctl

#include "device/description/MachineFacts.h"

#include "device/files/PlainFile.h"

#include <algorithm>
#include <memory>
#include <sstream>
#include <string>
#include <string_view>
#include <system_error>
#include <unicode/locid.h>
#include <unicode/timezone.h>
#include <unicode/unistr.h>

namespace nimbra::device {

namespace {

/// The lines of the file at `path`; none where it cannot be read: Linux then tells nothing.
std::vector<std::string> linesOf(const std::filesystem::path& path) {
    std::vector<std::string> lines;
    std::istringstream text(readPlainFile(path).value_or(std::string()));
    for (std::string line; std::getline(text, line);) {
        lines.push_back(line);
    }
    return lines;
}

std::string withoutQuotes(std::string value) {
    if (value.size() > 1 && value.front() == '"' && value.back() == '"') {
        value = value.substr(1, value.size() - 2);
    }
    return value;
}

std::string hostName(const std::filesystem::path& root) {
    constexpr std::string_view pretty = "PRETTY_HOSTNAME=";
    for (const std::string& line : linesOf(root / "etc/machine-info")) {
        if (line.starts_with(pretty)) {
            return withoutQuotes(line.substr(pretty.size()));
        }
    }
    const auto lines = linesOf(root / "etc/hostname");
    return lines.empty() ? std::string() : lines.front();
}

bool hasModem(const std::filesystem::path& root) {
    std::error_code failure;
    const std::filesystem::directory_iterator interfaces(root / "sys/class/net", failure);
    return !failure && std::any_of(begin(interfaces), end(interfaces), [](const auto& interface) {
        return std::ranges::count(linesOf(interface.path() / "uevent"), "DEVTYPE=wwan") > 0;
    });
}

std::string processLocale() {
    UErrorCode status = U_ZERO_ERROR;
    const auto tag = icu::Locale::getDefault().toLanguageTag<std::string>(status);
    return U_FAILURE(status) != 0 ? std::string() : tag;
}

std::string processTimeZone() {
    const std::unique_ptr<icu::TimeZone> zone(icu::TimeZone::createDefault());
    icu::UnicodeString identifier;
    std::string name;
    zone->getID(identifier).toUTF8String(name);
    return name;
}

} // namespace

DeviceDescription describeMachine(const std::filesystem::path& root) {
    DeviceDescription description;
    const auto use = [](std::string told, std::string& place) {
        if (!told.empty()) {
            place = std::move(told);
        }
    };
    use(hostName(root), description.name);
    use(processLocale(), description.locale);
    use(processTimeZone(), description.timeZone);
    description.cellularData = hasModem(root);
    return description;
}

} // namespace nimbra::device

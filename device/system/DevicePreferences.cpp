#include "device/system/DevicePreferences.h"

#include "device/files/Files.h"
#include "device/json/JsonReader.h"
#include "platform/system/SystemLog.h"

#include <nlohmann/json.hpp>
#include <system_error>
#include <utility>

namespace nimbra::device {

namespace {

std::expected<JsonReader, Error> readDomain(const std::filesystem::path& path) {
    auto reader = JsonReader::readFile(path);
    if (reader && !reader->isObject()) {
        reader->expected("an object of keys and values");
        return std::unexpected(*reader->problem());
    }
    return reader;
}

} // namespace

std::expected<void, Error> checkPreferences(const DevicePaths& paths) {
    const auto directory = paths.resolve(kPreferencesDirectory);
    if (!directory) {
        return std::unexpected(directory.error());
    }
    const auto files = entriesOfDirectory(*directory);
    if (!files) {
        return std::unexpected(files.error());
    }
    for (const std::filesystem::path& file : *files) {
        if (file.extension() == ".json") {
            const auto path =
                paths.resolve(std::string(kPreferencesDirectory) + '/' + file.filename().string());
            const auto reader = path ? readDomain(*path) : std::unexpected(path.error());
            if (!reader) {
                return std::unexpected(reader.error());
            }
        }
    }
    return {};
}

DevicePreferences::DevicePreferences(DevicePaths paths, SystemLog& log)
    : _paths(std::move(paths)), _log(log) {}

std::optional<std::int64_t>
DevicePreferences::appIntegerValueForKeyInDomain(const std::string& key,
                                                 const std::string& domain) const {
    const auto path = _paths.resolve(std::string(kPreferencesDirectory) + '/' + domain + ".json");
    std::error_code failure;
    if (path && !std::filesystem::exists(*path, failure) && !failure) {
        return std::nullopt;
    }
    const auto reader = path ? readDomain(*path) : std::unexpected(path.error());
    if (!reader) {
        _log.write(LogLevel::error, _paths.asTheDeviceSaysIt(reader.error()).description);
        return std::nullopt;
    }
    const nlohmann::ordered_json& value = reader->member(key).value();
    const bool fits = value.is_number_unsigned()
                          ? std::in_range<std::int64_t>(value.get<std::uint64_t>())
                          : value.is_number_integer();
    return fits ? std::optional(value.get<std::int64_t>()) : std::nullopt;
}

} // namespace nimbra::device

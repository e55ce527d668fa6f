#include "device/documents/DeviceLastSync.h"

#include "device/DeviceError.h"
#include "device/description/DescriptionFiles.h"
#include "device/description/Instant.h"
#include "device/documents/LastSyncSentence.h"
#include "platform/system/Clock.h"

#include <string>
#include <utility>

namespace nimbra::device {

namespace {

/// What the file says in one place: a string, or nothing for null. It was checked when it was read.
std::expected<std::optional<std::string>, Error> stringOrError(const nlohmann::json& value) {
    if (value.is_object()) {
        const nlohmann::json& error = value.at("error");
        return std::unexpected(Error{.domain = error.at("domain").get<std::string>(),
                                     .code = error.at("code").get<int>(),
                                     .description = error.at("description").get<std::string>()});
    }
    return value.is_string() ? std::optional(value.get<std::string>()) : std::nullopt;
}

std::expected<std::optional<Date>, Error> dateIn(const DeviceDescription& description) {
    const auto date = stringOrError(description.lastSyncDate);
    if (!date) {
        return std::unexpected(date.error());
    }
    return *date ? parseInstant(**date) : std::nullopt;
}

/// The daemon's file; an error calls it as the device does.
std::expected<DeviceDescription, Error> documentsOf(const DevicePaths& paths) {
    auto description = readDescriptionFile(paths, documentsFile);
    if (!description) {
        return std::unexpected(paths.asTheDeviceSaysIt(std::move(description.error())));
    }
    return description;
}

} // namespace

DeviceLastSync::DeviceLastSync(DevicePaths paths, DeviceSettings settings, const Clock& clock)
    : _paths(std::move(paths)), _settings(std::move(settings)), _clock(clock) {}

std::expected<std::optional<Date>, Error> DeviceLastSync::MRGetLastSyncDateWithError() const {
    const auto description = documentsOf(_paths);
    return description ? dateIn(*description) : std::unexpected(description.error());
}

std::expected<Text, Error> DeviceLastSync::MRGetLocalizedLastSyncWithError() const {
    const auto description = documentsOf(_paths);
    if (!description) {
        return std::unexpected(description.error());
    }
    if (!description->composesLastSyncText) {
        const auto given = stringOrError(description->lastSyncText);
        if (!given) {
            return std::unexpected(given.error());
        }
        return *given ? Text(**given) : Text();
    }
    const auto date = dateIn(*description);
    if (!date) {
        return std::unexpected(date.error());
    }
    if (!*date) {
        return Text();
    }
    auto sentence = lastSyncSentence(**date, {.locale = _settings.localeIdentifier(),
                                              .timeZone = _settings.timeZone(),
                                              .now = _clock.now()});
    if (!sentence) {
        return std::unexpected(
            deviceError("no sentence of the last sync: " + std::move(sentence.error())));
    }
    return Text(std::move(*sentence));
}

} // namespace nimbra::device

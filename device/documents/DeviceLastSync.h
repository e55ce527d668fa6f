#pragma once

#include "device/files/DevicePaths.h"
#include "device/system/DeviceSettings.h"
#include "platform/documents/LastSync.h"

namespace nimbra {
class Clock;
}

namespace nimbra::device {

/// The last sync as the device's `documents.json` has it now. Any thread.
///
/// A file that has the key `lastSyncText` has given the sentence; where the key is left out, the
/// sentence is composed from the date, in the user's language.
class DeviceLastSync final : public LastSync {
public:
    /// `clock` is not owned and outlives it.
    DeviceLastSync(DevicePaths paths, DeviceSettings settings, const Clock& clock);

    /// The file's error where it has one in the date's place, and also when it cannot be read.
    [[nodiscard]] std::expected<std::optional<Date>, Error>
    MRGetLastSyncDateWithError() const override;
    [[nodiscard]] std::expected<Text, Error> MRGetLocalizedLastSyncWithError() const override;

private:
    DevicePaths _paths;
    DeviceSettings _settings;
    const Clock& _clock;
};

} // namespace nimbra::device

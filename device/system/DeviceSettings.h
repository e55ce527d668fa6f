#pragma once

#include "platform/system/DeviceInfo.h"
#include "platform/values/Error.h"

#include <cstdint>
#include <expected>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>

namespace nimbra::device {

/// What `device.json` says of the device: its name, its language, its time zone, its screen and its
/// abilities. Copies are the same settings. Any thread.
class DeviceSettings {
public:
    /// Reads the file of the device in `root`. An error names the file and the place in it.
    [[nodiscard]] static std::expected<DeviceSettings, Error>
    open(const std::filesystem::path& root);

    /// The name that the user gave the device.
    [[nodiscard]] std::string name() const;

    /// The BCP 47 tag of the user's locale.
    [[nodiscard]] std::string localeIdentifier() const;
    /// A number that is another one after each change of the locale: to know cheaply that it is
    /// still the same.
    [[nodiscard]] std::uint64_t localeRevision() const;
    /// The IANA name of the time zone.
    [[nodiscard]] std::string timeZone() const;

    [[nodiscard]] bool hasCellularData() const;
    /// The name of the device's own wording of wireless networks; nothing for the usual one.
    [[nodiscard]] std::optional<std::string> wirelessVariant() const;

    [[nodiscard]] UserInterfaceIdiom userInterfaceIdiom() const;
    /// Nothing for a device without a screen.
    [[nodiscard]] std::optional<Screen> mainScreen() const;

    /// Shows everything in another locale than the file's, for this process only.
    void overrideLocale(const std::string& identifier);

    /// Reads the file again after it was changed; on an error all stays as it was.
    [[nodiscard]] std::expected<void, Error> reload();

private:
    struct State;
    explicit DeviceSettings(std::shared_ptr<State> state);

    std::shared_ptr<State> _state;
};

} // namespace nimbra::device

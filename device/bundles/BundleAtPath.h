#pragma once

#include "platform/system/Bundle.h"

#include <filesystem>
#include <memory>
#include <optional>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

class DeviceBundle;
class DeviceBundles;

/// A bundle that was found in its folder before it was loaded: it has neither identifier nor texts
/// nor images until it is. Any thread, but for loading.
class BundleAtPath final : public Bundle {
public:
    /// The bundle that the device calls `path` and that stands in `folder`, a path without links.
    /// Neither `bundles`, which load it, nor `log` is owned; both outlive it.
    BundleAtPath(Text path, std::filesystem::path folder, DeviceBundles& bundles, SystemLog& log);

    [[nodiscard]] const std::optional<BundleIdentifier>& identifier() const override;
    [[nodiscard]] Text localizedStringForKeyValueTable(const Text& key, const Text& value,
                                                       const Text& table) const override;
    [[nodiscard]] std::shared_ptr<const Image> imageNamed(const Text& name) const override;
    [[nodiscard]] bool isLoaded() const override;
    std::expected<void, Error> load() override;

private:
    [[nodiscard]] std::shared_ptr<DeviceBundle> loadedBundle() const;

    const Text _path;
    const std::filesystem::path _folder;
    DeviceBundles& _bundles;
    SystemLog& _log;
};

} // namespace nimbra::device

#pragma once

#include "platform/system/Bundle.h"

#include <map>
#include <string>

namespace nimbra {
struct ControllerClass;
}

namespace nimbra::device {

/// A bundle that is loaded from a folder. Any thread, but where an operation says otherwise.
class DeviceBundle final : public Bundle {
public:
    [[nodiscard]] const BundleIdentifier& identifier() const override;
    [[nodiscard]] Text localizedStringForKeyValueTable(const Text& key, const Text& value,
                                                       const Text& table) const override;

    /// The class that the manifest names as the bundle's first; owned by the class registry.
    [[nodiscard]] const ControllerClass& principalClass() const;

    /// Uses `texts` as the table `table` in every language from now on, instead of the bundle's
    /// own.
    void replaceTable(const std::string& table, std::map<std::string, std::string> texts);
};

} // namespace nimbra::device

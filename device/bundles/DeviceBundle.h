#pragma once

#include "device/bundles/BundleImages.h"
#include "device/bundles/StringTables.h"
#include "platform/system/Bundle.h"

#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string>

namespace nimbra {
struct ControllerClass;
}

namespace nimbra::device {

class DeviceSettings;

/// A bundle that is loaded from a folder. Any thread, but where an operation says otherwise.
class DeviceBundle final : public Bundle {
public:
    /// What a bundle is made of. The settings and the class are not owned and outlive it.
    struct Parts {
        std::optional<BundleIdentifier> identifier;
        /// The language whose tables have every key.
        std::string developmentLanguage;
        LanguageTables tables;
        BundleImages images;
        /// Null for a bundle whose classes are found by their names only.
        const ControllerClass* principalClass;
        const DeviceSettings* settings;
    };

    explicit DeviceBundle(Parts parts);

    [[nodiscard]] const std::optional<BundleIdentifier>& identifier() const override;
    [[nodiscard]] Text localizedStringForKeyValueTable(const Text& key, const Text& value,
                                                       const Text& table) const override;
    [[nodiscard]] std::shared_ptr<const Image> imageNamed(const Text& name) const override;
    [[nodiscard]] bool isLoaded() const override { return true; }
    std::expected<void, Error> load() override { return {}; }

    [[nodiscard]] bool hasPrincipalClass() const { return _parts.principalClass != nullptr; }
    /// The class that the manifest names as the bundle's first, which it has; owned by the class
    /// registry.
    [[nodiscard]] const ControllerClass& principalClass() const;

    /// Uses `texts` as the table `table` in every language from now on, instead of the bundle's
    /// own.
    void replaceTable(const std::string& table, std::map<std::string, std::string> texts);

private:
    [[nodiscard]] std::shared_ptr<const StringTables> tablesOfUser() const;

    const Parts _parts;
    mutable std::mutex _mutex;
    StringTables _replacements;
    /// The tables as the user of `_locale` sees them: made once for a locale, so that a lookup
    /// needs no search along the languages.
    mutable std::shared_ptr<const StringTables> _tables;
    mutable std::string _locale;
};

} // namespace nimbra::device

#include "device/bundles/DeviceBundle.h"

#include "device/system/DeviceSettings.h"
#include "device/system/LanguageChain.h"

#include <utility>

namespace nimbra::device {

DeviceBundle::DeviceBundle(Parts parts) : _parts(std::move(parts)) {}

const std::optional<BundleIdentifier>& DeviceBundle::identifier() const {
    return _parts.identifier;
}

const ControllerClass& DeviceBundle::principalClass() const {
    return *_parts.principalClass;
}

Text DeviceBundle::localizedStringForKeyValueTable(const Text& key, const Text& value,
                                                   const Text& table) const {
    const auto tables = tablesOfUser();
    if (const auto named = tables->find(table.string()); named != tables->end()) {
        if (const auto text = named->second.find(key.string()); text != named->second.end()) {
            return text->second;
        }
    }
    return value;
}

std::shared_ptr<const Image> DeviceBundle::imageNamed(const Text& name) const {
    return _parts.images.imageNamed(name.string());
}

void DeviceBundle::replaceTable(const std::string& table,
                                std::map<std::string, std::string> texts) {
    StringTable replacement;
    for (auto& [key, text] : texts) {
        replacement.emplace(key, Text(std::move(text)));
    }
    const std::scoped_lock lock(_mutex);
    _replacements.insert_or_assign(table, std::move(replacement));
    _tables = nullptr;
}

std::shared_ptr<const StringTables> DeviceBundle::tablesOfUser() const {
    std::string locale = _parts.settings->localeIdentifier();
    const std::scoped_lock lock(_mutex);
    if (!_tables || locale != _locale) {
        std::vector<std::string> languages = languageChain(locale);
        languages.push_back(_parts.developmentLanguage);
        StringTables tables = _parts.tables.merged(languages);
        for (const auto& [name, table] : _replacements) {
            tables.insert_or_assign(name, table);
        }
        _tables = std::make_shared<const StringTables>(std::move(tables));
        _locale = std::move(locale);
    }
    return _tables;
}

} // namespace nimbra::device

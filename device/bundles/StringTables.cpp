#include "device/bundles/StringTables.h"

#include "device/files/Files.h"
#include "device/json/JsonReader.h"

#include <nlohmann/json.hpp>
#include <system_error>

namespace nimbra::device {

namespace {

std::expected<StringTable, Error> readTable(const std::filesystem::path& path) {
    const auto reader = JsonReader::readFile(path);
    if (!reader) {
        return std::unexpected(reader.error());
    }
    StringTable table;
    if (!reader->isObject()) {
        reader->expected("an object of keys and texts");
    } else {
        for (const auto& [key, text] : reader->value().items()) {
            if (text.is_string()) {
                table.emplace(key, Text(text.get<std::string>()));
            } else {
                reader->member(key).expected("a text");
            }
        }
    }
    if (const auto problem = reader->problem()) {
        return std::unexpected(*problem);
    }
    return table;
}

} // namespace

std::expected<LanguageTables, Error> LanguageTables::read(const std::filesystem::path& folder) {
    LanguageTables tables;
    const auto languages = entriesOfDirectory(folder);
    if (!languages) {
        return std::unexpected(languages.error());
    }
    for (const std::filesystem::path& language : *languages) {
        std::error_code failure;
        if (!std::filesystem::is_directory(language, failure)) {
            continue;
        }
        const auto files = entriesOfDirectory(language);
        if (!files) {
            return std::unexpected(files.error());
        }
        for (const std::filesystem::path& file : *files) {
            if (file.extension() != ".json") {
                continue;
            }
            auto table = readTable(file);
            if (!table) {
                return std::unexpected(table.error());
            }
            tables._languages[language.filename().string()].emplace(file.stem().string(),
                                                                    std::move(*table));
        }
    }
    return tables;
}

StringTables LanguageTables::merged(const std::vector<std::string>& languages) const {
    StringTables merged;
    for (const std::string& language : languages) {
        const auto entry = _languages.find(language);
        if (entry == _languages.end()) {
            continue;
        }
        for (const auto& [name, table] : entry->second) {
            // What an earlier, better language has stays.
            merged[name].insert(table.begin(), table.end());
        }
    }
    return merged;
}

} // namespace nimbra::device

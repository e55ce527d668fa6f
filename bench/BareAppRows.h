#pragma once

#include <SQLiteCpp/SQLiteCpp.h>
#include <filesystem>
#include <memory>
#include <string>
#include <unicode/coll.h>
#include <vector>

namespace nimbra::bench {

/// What rows of applications cannot do without: the consent records, the names in the desktop
/// entries, and their order.
class BareAppRows {
public:
    /// Reads the device in `root`.
    explicit BareAppRows(const std::filesystem::path& root);

    /// The names of the applications that have records, in the order of their rows.
    [[nodiscard]] std::vector<std::string> sortedNames();

private:
    void readRecords(const char* service, std::vector<std::string>& identifiers);
    [[nodiscard]] std::string nameOf(const std::string& identifier) const;

    std::filesystem::path _entries;
    SQLite::Database _database;
    SQLite::Statement _select;
    std::unique_ptr<icu::Collator> _collator;
};

} // namespace nimbra::bench

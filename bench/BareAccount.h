#pragma once

#include <SQLiteCpp/SQLiteCpp.h>
#include <filesystem>

namespace nimbra::bench {

/// The device's account, read with nothing around SQLite.
class BareAccount {
public:
    explicit BareAccount(const std::filesystem::path& database)
        : _database(database.string()),
          _select(_database, "SELECT uses_stratafile, dataclass, enabled FROM accounts LEFT JOIN "
                             "account_dataclasses ON account = identifier WHERE identifier = ?") {
        _select.bind(1, "primary");
    }

    /// Reads every row of the account and says how many data classes it has.
    [[nodiscard]] int countDataclasses() {
        int count = 0;
        while (_select.executeStep()) {
            count += _select.getColumn(1).isNull() ? 0 : 1;
        }
        _select.reset();
        return count;
    }

private:
    SQLite::Database _database;
    SQLite::Statement _select;
};

} // namespace nimbra::bench

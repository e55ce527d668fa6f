#include "bench/BareAppRows.h"

#include <algorithm>
#include <array>
#include <fcntl.h>
#include <stdexcept>
#include <string_view>
#include <unistd.h>

namespace nimbra::bench {

BareAppRows::BareAppRows(const std::filesystem::path& root)
    : _entries(root / "usr/share/applications"),
      _database((root / "var/lib/nimbra/consent.db").string()),
      _select(_database,
              "SELECT bundle, granted FROM consent WHERE service = ? ORDER BY position") {
    UErrorCode status = U_ZERO_ERROR;
    _collator.reset(icu::Collator::createInstance(icu::Locale::getUS(), status));
    if (U_FAILURE(status) != 0) {
        throw std::runtime_error("no collator");
    }
    _collator->setStrength(icu::Collator::SECONDARY);
    _collator->setAttribute(UCOL_NUMERIC_COLLATION, UCOL_ON, status);
}

std::vector<std::string> BareAppRows::sortedNames() {
    std::vector<std::string> identifiers;
    readRecords("kPRVServiceTidewater", identifiers);
    readRecords("kPRVServiceBrackwater", identifiers);
    std::ranges::sort(identifiers);
    identifiers.erase(std::ranges::unique(identifiers).begin(), identifiers.end());

    std::vector<std::string> names;
    names.reserve(identifiers.size());
    for (const std::string& identifier : identifiers) {
        names.push_back(nameOf(identifier));
    }
    std::ranges::stable_sort(names, [this](const std::string& left, const std::string& right) {
        UErrorCode status = U_ZERO_ERROR;
        return _collator->compareUTF8(left, right, status) == UCOL_LESS;
    });
    return names;
}

void BareAppRows::readRecords(const char* service, std::vector<std::string>& identifiers) {
    _select.reset();
    _select.bind(1, service);
    while (_select.executeStep()) {
        identifiers.push_back(_select.getColumn(0).getString());
        static_cast<void>(_select.getColumn(1).getInt());
    }
}

std::string BareAppRows::nameOf(const std::string& identifier) const {
    const int file = ::open((_entries / (identifier + ".desktop")).c_str(), O_RDONLY | O_CLOEXEC);
    if (file < 0) {
        throw std::runtime_error("no entry for " + identifier);
    }
    std::array<char, 4096> bytes; // NOLINT(*-member-init): filled by the read
    const ssize_t count = ::read(file, bytes.data(), bytes.size());
    ::close(file);
    const std::string_view text(bytes.data(), count > 0 ? static_cast<std::size_t>(count) : 0);
    constexpr std::string_view key = "\nName=";
    const auto start = text.find(key) + key.size();
    return std::string(text.substr(start, text.find('\n', start) - start));
}

} // namespace nimbra::bench

#pragma once

#include <ostream>
#include <string>

namespace nimbra {

/// A user's language and regional habits, named by a BCP 47 tag ("de-DE").
struct Locale {
    std::string identifier;

    friend bool operator==(const Locale&, const Locale&) = default;
};

inline std::ostream& operator<<(std::ostream& out, const Locale& locale) {
    return out << locale.identifier;
}

} // namespace nimbra

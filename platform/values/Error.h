#pragma once

#include <ostream>
#include <string>

namespace nimbra {

/// What went wrong: who says so (`domain`), its number there, and a sentence for a log.
struct Error {
    std::string domain;
    int code = 0;
    std::string description;

    /// The error as one line: "description (domain code)".
    [[nodiscard]] std::string line() const;

    friend bool operator==(const Error&, const Error&) = default;
};

inline std::string Error::line() const {
    return description + " (" + domain + ' ' + std::to_string(code) + ')';
}

inline std::ostream& operator<<(std::ostream& out, const Error& error) {
    return out << error.line();
}

} // namespace nimbra

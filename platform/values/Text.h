#pragma once

#include <compare>
#include <memory>
#include <ostream>
#include <string>
#include <string_view>

namespace nimbra {

/// An immutable UTF-8 text with an identity, which may be absent.
///
/// Copies share one string object. Two texts are equal when their contents are; they are the same
/// object only when one was copied from the other. An absent text equals only another absent one.
/// May be copied and read on any thread.
class Text {
public:
    /// The absent text.
    Text() = default;
    Text(std::nullptr_t) {} // NOLINT(google-explicit-constructor): absence reads as `nullptr`
    /// A new string object; `utf8` is taken as it is.
    Text(std::string utf8); // NOLINT(google-explicit-constructor): a text is a string with identity
    Text(std::string_view utf8); // NOLINT(google-explicit-constructor)
    Text(const char* utf8);      // NOLINT(google-explicit-constructor)

    [[nodiscard]] bool isPresent() const { return _string != nullptr; }
    explicit operator bool() const { return isPresent(); }

    /// The content; empty for an absent text.
    [[nodiscard]] const std::string& string() const;

    /// Whether both are the very same string object. Absent texts have no identity.
    [[nodiscard]] bool isSameObjectAs(const Text& other) const {
        return _string != nullptr && _string == other._string;
    }

    friend bool operator==(const Text& left, const Text& right) {
        return left.isPresent() == right.isPresent() && left.string() == right.string();
    }

private:
    std::shared_ptr<const std::string> _string;
};

/// Prints the content in quotation marks, or `absent`.
std::ostream& operator<<(std::ostream& out, const Text& text);

} // namespace nimbra

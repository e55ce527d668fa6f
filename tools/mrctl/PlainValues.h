#pragma once

#include <cstddef>
#include <string_view>

namespace nimbra::mrctl {

// Of values that stand at `begin` in `text`, behind a name that ends at `name`, what can be read
// without learning a secret.

/// Whether the value is `null`, `true` or the like, and no more: nothing but what closes it
/// follows, or another name with its sign. "no" may also begin a password.
[[nodiscard]] bool isPlainValue(std::string_view text, std::size_t name, std::size_t begin);

/// The end of the identifier of an application or a notification that the value begins with;
/// `begin` for none. It has three parts and more, the first two in small letters.
[[nodiscard]] std::size_t endOfIdentifier(std::string_view text, std::size_t begin);

/// Whether nothing follows at `end`, where a part of the value ends, that may belong to the value.
[[nodiscard]] bool isEndOfValue(std::string_view text, std::size_t name, std::size_t begin,
                                std::size_t end);

/// Whether the value begins with the number of an error, which is short and no group of a longer
/// number.
[[nodiscard]] bool isErrorNumber(std::string_view text, std::size_t begin);

/// Whether `word` is all of what a plain value is: "no" and the like, in capitals or not.
[[nodiscard]] bool isPlainWord(std::string_view word);

} // namespace nimbra::mrctl

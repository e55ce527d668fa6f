#pragma once

#include "tools/mrctl/SecretKind.h"

#include <cstddef>
#include <optional>
#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// A piece of a text that looks like a secret.
struct FoundSecret {
    std::size_t begin;
    std::size_t size;
    SecretKind kind;
};

/// What in `text` looks like a secret; pieces may overlap. Found are e-mail addresses;
/// logins, passwords and paths in URLs; what stands behind "Bearer" and behind a name such as
/// "password" with "=" or ":"; long hexadecimal and base64 texts; names of document files; what a
/// message quotes of a file; and paths but those to places that are the same on every device. A
/// path ends at the quotation mark that closes it, else before ": " or with its line: a name may
/// have blanks. Of a path below `root`, where a device stands, only that much is found if the rest
/// is the same on every device.
[[nodiscard]] std::vector<FoundSecret> findSecrets(std::string_view text, std::string_view root);

/// What a value is whose key or variable is called `name`; nothing where the name does not tell.
[[nodiscard]] std::optional<SecretKind> kindOfValueNamed(std::string_view name);

/// Whether `name` ends like the file of a document.
[[nodiscard]] bool isDocumentName(std::string_view name);

} // namespace nimbra::mrctl

#pragma once

#include "tools/mrctl/SecretKind.h"

#include <cstddef>
#include <limits>
#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// A piece of a text that looks like a secret.
struct FoundSecret {
    std::size_t begin = 0;
    std::size_t size = 0;
    SecretKind kind = SecretKind::secret;
    /// How many bytes of its beginning are worth to be searched for elsewhere; all if larger.
    std::size_t searched = std::numeric_limits<std::size_t>::max();
};

/// The longest text that is searched for secrets, in bytes.
inline constexpr std::size_t kLongestText = 4096;

/// What in `text` looks like a secret, as it stands and decoded; pieces may overlap. Found are
/// e-mail addresses; logins, passwords and paths in URLs; everything behind a name such as
/// "password"; tokens; names of document files; what a message quotes of a file; and paths but
/// those to places that are the same on every device. Of a path below `root`, where a device
/// stands, only that much is found if the rest is the same on every device. The time that it takes
/// grows with the text's square at most: no text should be longer than `kLongestText`.
[[nodiscard]] std::vector<FoundSecret> findSecrets(std::string_view text, std::string_view root);

} // namespace nimbra::mrctl

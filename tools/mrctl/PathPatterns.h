#pragma once

#include "tools/mrctl/SecretPatterns.h"

#include <string>
#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// Adds the paths in `text` to `found`, as `findSecrets` says. A name may have blanks, colons and
/// quotation marks: a path goes on to the last of the marks that close it, else to the end of the
/// text or before the words of the system for an error.
void findPaths(std::string_view text, std::string_view root, std::vector<FoundSecret>& found);

/// What a path tells beyond itself: whose home it is in, and what a document is called. Empty where
/// it does not tell.
struct PathNames {
    std::string user;
    std::string document;
};
[[nodiscard]] PathNames namesInPath(std::string_view path);

} // namespace nimbra::mrctl

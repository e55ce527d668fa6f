#pragma once

#include "tools/mrctl/SecretPatterns.h"

#include <string>
#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// Adds the paths in `text` to `found`, as `findSecrets` says.
void findPaths(std::string_view text, std::string_view root, std::vector<FoundSecret>& found);

/// Adds the names of document files in `text`: with their blanks where they stand in quotation
/// marks, else the last word.
void findDocumentNames(std::string_view text, std::vector<FoundSecret>& found);

/// What a path tells beyond itself: whose home it is in, and what a document is called.
struct PathNames {
    std::string user;
    std::string document;
};
[[nodiscard]] PathNames namesInPath(std::string_view path);

} // namespace nimbra::mrctl

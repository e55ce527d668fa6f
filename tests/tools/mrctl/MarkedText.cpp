#include "tests/tools/mrctl/MarkedText.h"

#include "tools/mrctl/SecretPatterns.h"

#include <algorithm>

namespace nimbra::mrctl {

std::string marked(const std::string& text) {
    auto found = findSecrets(text, kMarkedRoot);
    std::ranges::stable_sort(found, [](const FoundSecret& left, const FoundSecret& right) {
        return left.begin != right.begin ? left.begin < right.begin : left.size > right.size;
    });
    std::string result;
    std::size_t done = 0;
    for (const auto& [begin, size, kind, searched] : found) {
        if (begin < done) {
            done = std::max(done, begin + size);
            continue;
        }
        result += text.substr(done, begin - done) + '<' + std::string(nameOf(kind)) + '>';
        done = begin + size;
    }
    return result + text.substr(done);
}

} // namespace nimbra::mrctl

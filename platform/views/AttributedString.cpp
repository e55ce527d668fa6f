#include "platform/views/AttributedString.h"

namespace nimbra {

AttributedString::AttributedString(const Text& text, const TextAttributes& attributes) {
    if (!text.string().empty()) {
        _runs.push_back({text.string(), attributes});
    }
}

std::string AttributedString::string() const {
    std::string text;
    for (const Run& run : _runs) {
        text += run.text;
    }
    return text;
}

void MutableAttributedString::appendAttributedString(const AttributedString& more) {
    // A copy, as a text may be appended to itself.
    for (const Run& run : std::vector(more.runs())) {
        if (!_runs.empty() && _runs.back().attributes == run.attributes) {
            _runs.back().text += run.text;
        } else {
            _runs.push_back(run);
        }
    }
}

} // namespace nimbra

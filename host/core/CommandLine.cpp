#include "host/core/CommandLine.h"

#include "device/system/LanguageChain.h"

#include <cstddef>
#include <span>
#include <string_view>

namespace nimbra::host {

std::string problemOfLanguage(const std::string& tag) {
    return device::isLanguageTag(tag) ? std::string()
                                      : '"' + tag + "\" is not a language tag such as \"de-DE\"";
}

std::string problemOfPath(const std::string& path) {
    return path.empty() ? "is empty" : "";
}

std::string problemOfWords(int count, char** words) {
    for (const std::string_view word : std::span(words, static_cast<std::size_t>(count))) {
        if (word == "--") {
            break;
        }
        if (word.starts_with("--") && word.find('=') == word.size() - 1) {
            return std::string(word.substr(0, word.size() - 1)) + ": is empty";
        }
    }
    return "";
}

} // namespace nimbra::host

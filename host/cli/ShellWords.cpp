#include "host/cli/ShellWords.h"

#include <algorithm>

namespace nimbra::cli {

namespace {

bool isBlank(char character) {
    return character == ' ' || character == '\t' || character == '\r';
}

} // namespace

ShellWords ShellWords::split(std::string_view line) {
    ShellWords result;
    char quote = '\0';
    bool isInWord = false;
    for (std::size_t index = 0; index < line.size(); ++index) {
        char character = line[index];
        if (quote == '\0' && isBlank(character)) {
            isInWord = false;
            continue;
        }
        if (!isInWord) {
            isInWord = true;
            result.words.emplace_back();
            result.lastStart = index;
        }
        if (quote == '\0' && (character == '"' || character == '\'')) {
            quote = character;
        } else if (character == quote) {
            quote = '\0';
        } else {
            if (character == '\\' && quote != '\'' && index + 1 < line.size()) {
                character = line[++index];
            }
            result.words.back() += character;
        }
    }
    result.isClosed = quote == '\0';
    if (!isInWord) {
        result.lastStart = line.size();
    }
    return result;
}

std::string quotedWord(const std::string& word) {
    constexpr std::string_view special = " \t\"'\\";
    if (!word.empty() && word.find_first_of(special) == std::string::npos) {
        return word;
    }
    std::string quoted = "\"";
    for (const char character : word) {
        if (character == '"' || character == '\\') {
            quoted += '\\';
        }
        quoted += character;
    }
    return quoted + '"';
}

} // namespace nimbra::cli

#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::cli {

/// A line of the prompt in words: blanks part them, quotation marks of both kinds and a backslash
/// take blanks into a word.
struct ShellWords {
    std::vector<std::string> words;
    /// Where the last word starts in the line, with its quotation mark; the line's end behind a
    /// blank, where a further word would start.
    std::size_t lastStart = 0;
    /// False when a quotation mark has no partner; the last word then goes to the line's end.
    bool isClosed = true;

    [[nodiscard]] static ShellWords split(std::string_view line);
};

/// `word` so that it is one word in a line.
[[nodiscard]] std::string quotedWord(const std::string& word);

} // namespace nimbra::cli

#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <set>
#include <string>
#include <string_view>
#include <unordered_map>

namespace nimbra::mrctl {

/// A spelling that texts are searched for.
struct Spelling {
    /// The value that it is one of.
    std::size_t value;
    bool asWholeWord;
    /// How many times signs or blanks stand inside.
    std::size_t gaps = 0;
};

/// Finds many spellings at once: the time that it takes hardly depends on how many there are.
class SpellingIndex {
public:
    /// Adds `text`, of three bytes at least, unless it is there.
    void add(const std::string& text, const Spelling& spelling) {
        _spellings.emplace(text, spelling);
        _sizesOfStart[startOf(text)].insert(text.size());
    }

    /// Calls `found` with the begin, the end and the spelling of each that stands in `text`.
    template <class Found>
    void find(std::string_view text, Found found) const {
        for (std::size_t begin = 0; begin + startSize <= text.size(); ++begin) {
            const auto sizes = _sizesOfStart.find(startOf(text.substr(begin)));
            if (sizes == _sizesOfStart.end()) {
                continue;
            }
            for (const std::size_t size : sizes->second) {
                if (begin + size > text.size()) {
                    break;
                }
                const auto spelling = _spellings.find(text.substr(begin, size));
                if (spelling != _spellings.end()) {
                    found(begin, begin + size, spelling->second);
                }
            }
        }
    }

private:
    /// Finds a spelling by a piece of a text.
    struct Hash {
        // NOLINTNEXTLINE(readability-identifier-naming): the library looks for this name
        using is_transparent = void;
        std::size_t operator()(std::string_view text) const {
            return std::hash<std::string_view>()(text);
        }
    };

    /// How many bytes the search looks at first.
    static constexpr std::size_t startSize = 3;

    static std::uint32_t startOf(std::string_view text) {
        std::uint32_t start = 0;
        for (const char character : text.substr(0, startSize)) {
            start = start * 256U + static_cast<unsigned char>(character);
        }
        return start;
    }

    std::unordered_map<std::string, Spelling, Hash, std::equal_to<>> _spellings;
    /// How long the spellings are that begin with three bytes.
    std::unordered_map<std::uint32_t, std::set<std::size_t>> _sizesOfStart;
};

} // namespace nimbra::mrctl

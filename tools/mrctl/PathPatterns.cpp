#include "tools/mrctl/PathPatterns.h"

#include "tools/mrctl/Characters.h"

#include <algorithm>
#include <array>
#include <utility>

namespace nimbra::mrctl {

namespace {

/// What closes that which `open` opens; empty for what opens nothing.
std::string_view closingOf(std::string_view before) {
    constexpr std::array<std::pair<std::string_view, std::string_view>, 9> pairs{{
        {"\"", "\""},
        {"'", "'"},
        {"`", "`"},
        {"(", ")"},
        {"[", "]"},
        {"<", ">"},
        {"\u201c", "\u201d"},
        {"\u2018", "\u2019"},
        {"\u00ab", "\u00bb"},
    }};
    for (const auto& [open, close] : pairs) {
        if (before.ends_with(open)) {
            return close;
        }
    }
    return {};
}

/// Where the path that begins at `begin` ends at the latest.
std::size_t endOfPath(std::string_view text, std::size_t begin) {
    const std::size_t lineEnd = std::min(text.find('\n', begin), text.size());
    const std::string_view line = text.substr(0, lineEnd);
    if (const std::string_view closing = closingOf(text.substr(0, begin)); !closing.empty()) {
        if (const std::size_t end = line.find(closing, begin); end != std::string_view::npos) {
            return end > begin && line[end - 1] == '\\' ? end - 1 : end;
        }
    }
    std::size_t end = std::min({line.find(": ", begin), line.find('"', begin), line.size()});
    while (end > begin &&
           (std::string_view(".,;:!?)]}\\'").contains(line[end - 1]) || isBlank(line[end - 1]))) {
        --end;
    }
    return end;
}

bool isIn(std::string_view path, std::string_view place) {
    return path.starts_with(place) && (path.size() == place.size() || path[place.size()] == '/' ||
                                       !isWord(path[place.size()]));
}

/// Whether `path` says nothing of its user: a place of the system, or one in a JSON document.
bool isEverywhere(std::string_view path) {
    constexpr std::array places{"/var/lib/nimbra",
                                "/var/log/nimbra",
                                "/run/nimbra",
                                "/usr",
                                "/System",
                                "/etc",
                                "/proc",
                                "/sys",
                                "/dev",
                                "/containers",
                                "/abilities",
                                "/screen",
                                "/lastSyncDate",
                                "/lastSyncText",
                                "/incompatible",
                                "/needUpgrade",
                                "/cloudSyncDenied"};
    constexpr std::array nowhere{"/..",       "/run/nimbra/progress/",
                                 "/home",     "/run/nimbra/priority-hints/",
                                 "/Users/",   "/.cache/",
                                 "/.config/", "/.local/"};
    return std::ranges::any_of(places, [path](const char* place) { return isIn(path, place); }) &&
           std::ranges::none_of(nowhere, [path](const char* part) { return path.contains(part); });
}

bool canStartName(char character) {
    return isWord(character) || isBeyondAscii(character) ||
           std::string_view("._~@+-%").contains(character);
}

/// Where the path begins whose first "/" stands at `slash`; the text's end where none does.
std::size_t startOfPath(std::string_view text, std::size_t slash) {
    std::size_t begin = slash;
    while (begin > 0 && (text[begin - 1] == '.' || text[begin - 1] == '~')) {
        --begin;
    }
    const char before = begin > 0 ? text[begin - 1] : ' ';
    const bool isInside = isWord(before) || before == '/' || before == '<';
    const bool goesOn = slash + 1 < text.size() && canStartName(text[slash + 1]);
    return isInside || !goesOn ? text.size() : begin;
}

bool looksLikePath(std::string_view path) {
    return std::ranges::count(path, '/') >= 2 || path.contains('.') || path.starts_with('~') ||
           path.starts_with("/root") || path.starts_with("/home");
}

} // namespace

void findPaths(std::string_view text, std::string_view root, std::vector<FoundSecret>& found) {
    for (std::size_t slash = text.find('/'); slash != std::string_view::npos;
         slash = text.find('/', slash + 1)) {
        const std::size_t begin = startOfPath(text, slash);
        if (begin == text.size()) {
            continue;
        }
        const std::size_t end = endOfPath(text, begin);
        const std::string_view path = text.substr(begin, std::max(end, begin) - begin);
        if (root.size() > 1 && path.starts_with(root) &&
            (path.size() == root.size() || isEverywhere(path.substr(root.size())))) {
            found.push_back({begin, root.size(), SecretKind::path});
            slash = begin + root.size();
        } else if (looksLikePath(path) && !isEverywhere(path)) {
            found.push_back({begin, path.size(), SecretKind::path});
            slash = std::max(slash, end - 1);
        }
    }
}

bool isDocumentName(std::string_view name) {
    constexpr std::array endings{"pdf", "doc",  "docx", "xls",  "xlsx",  "ppt",    "pptx", "txt",
                                 "rtf", "odt",  "ods",  "odp",  "csv",   "md",     "epub", "jpg",
                                 "png", "jpeg", "gif",  "heic", "svg",   "tiff",   "mov",  "mp3",
                                 "mp4", "m4a",  "wav",  "zip",  "pages", "numbers"};
    const std::size_t dot = name.rfind('.');
    return dot != std::string_view::npos && dot > 0 &&
           std::ranges::find(endings, lowerCase(name.substr(dot + 1))) != endings.end();
}

void findDocumentNames(std::string_view text, std::vector<FoundSecret>& found) {
    for (std::size_t dot = text.find('.'); dot != std::string_view::npos;
         dot = text.find('.', dot + 1)) {
        std::size_t end = dot + 1;
        while (end < text.size() && isWord(text[end])) {
            ++end;
        }
        std::size_t begin = dot;
        while (begin > 0 && !isBlank(text[begin - 1]) && !isQuote(text[begin - 1]) &&
               text[begin - 1] != '/') {
            --begin;
        }
        if (!isDocumentName(text.substr(begin, end - begin))) {
            continue;
        }
        const std::string_view line = text.substr(0, end);
        if (const std::size_t quote = line.find_last_of("\"'`", begin);
            end < text.size() && quote != std::string_view::npos && text[quote] == text[end]) {
            begin = quote + 1;
        }
        found.push_back({begin, end - begin, SecretKind::file});
    }
}

PathNames namesInPath(std::string_view path) {
    PathNames names;
    for (const std::string homes : {"/home", "/Users", "/media"}) {
        const std::size_t at = path.find(homes + '/');
        if (at != std::string_view::npos) {
            const std::string_view rest = path.substr(at + homes.size() + 1);
            names.user = std::string(rest.substr(0, rest.find_first_of("/ ")));
        }
    }
    const std::string_view last = path.substr(path.rfind('/') + 1);
    if (isDocumentName(last)) {
        names.document = std::string(last);
    }
    return names;
}

} // namespace nimbra::mrctl

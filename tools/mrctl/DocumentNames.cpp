#include "tools/mrctl/DocumentNames.h"

#include "tools/mrctl/Characters.h"

#include <algorithm>
#include <array>
#include <utility>

namespace nimbra::mrctl {

namespace {

/// The longest name that a file can have.
constexpr std::size_t longestName = 255;

bool isDocumentEnding(std::string_view ending) {
    constexpr std::array endings{
        "pdf",  "doc",  "docx", "docm", "dotx", "xls", "xlsx",  "xlsm",    "ppt",  "pptx",
        "pptm", "txt",  "rtf",  "odt",  "ods",  "odp", "odg",   "csv",     "tsv",  "md",
        "tex",  "epub", "mobi", "jpg",  "jpeg", "png", "gif",   "heic",    "svg",  "tiff",
        "tif",  "webp", "bmp",  "psd",  "dwg",  "raw", "mov",   "mp3",     "mp4",  "m4a",
        "m4v",  "wav",  "flac", "ogg",  "avi",  "mkv", "webm",  "zip",     "tar",  "gz",
        "tgz",  "rar",  "7z",   "dmg",  "iso",  "key", "pages", "numbers", "html", "htm",
        "xml",  "eml",  "msg",  "mbox", "pst",  "vcf", "ics",   "kdbx",    "kdb",  "sqlite",
        "p12",  "pfx",  "pem",  "crt",  "cer",  "gpg", "asc",   "ovpn",    "bak"};
    return std::ranges::find(endings, lowerCase(ending)) != endings.end();
}

/// Where the name begins that ends at `end` and is closed there; `end` where nothing closes it.
std::size_t startOfQuoted(std::string_view text, std::size_t end) {
    constexpr std::array<std::pair<std::string_view, std::string_view>, 12> pairs{{
        {"\"", "\""},
        {"'", "'"},
        {"`", "`"},
        {"\u201c", "\u201d"},
        {"\u201e", "\u201c"},
        {"\u201d", "\u201d"},
        {"\u2018", "\u2019"},
        {"\u201a", "\u2018"},
        {"\u00ab", "\u00bb"},
        {"\u00bb", "\u00ab"},
        {"\u300c", "\u300d"},
        {"(", ")"},
    }};
    const std::size_t limit = end > longestName ? end - longestName : 0;
    for (const auto& [open, close] : pairs) {
        if (!text.substr(end).starts_with(close)) {
            continue;
        }
        const std::size_t at = text.substr(0, end).rfind(open);
        if (at != std::string_view::npos && at >= limit) {
            return at + open.size();
        }
    }
    return end;
}

/// Where the words before `begin` begin that may belong to a name: those with a capital, and short
/// ones among them; not before `least`.
std::size_t startOfWords(std::string_view text, std::size_t begin, std::size_t least) {
    constexpr std::size_t shortWord = 4;
    std::size_t start = begin;
    std::size_t at = begin;
    while (at > least && text[at - 1] == ' ' && begin - at < longestName) {
        std::size_t word = at - 1;
        while (word > least && !isBlank(text[word - 1]) && !isQuote(text[word - 1])) {
            --word;
        }
        const std::string_view name = text.substr(word, at - 1 - word);
        if (name.empty() || std::string_view(":;,=)").contains(name.back())) {
            break;
        }
        const bool hasCapital = !isLower(name.front());
        if (!hasCapital && name.size() > shortWord) {
            break;
        }
        start = hasCapital ? word : start;
        at = word;
    }
    return start;
}

} // namespace

void findDocumentNames(std::string_view text, std::vector<FoundSecret>& found) {
    // A second name does not begin in the first.
    std::size_t least = 0;
    for (std::size_t dot = text.find('.'); dot != std::string_view::npos;
         dot = text.find('.', dot + 1)) {
        const std::size_t end = endOfRun(text, dot + 1, isAlphanumeric);
        if (!isDocumentEnding(text.substr(dot + 1, end - dot - 1))) {
            continue;
        }
        std::size_t begin = dot;
        while (begin > least && dot - begin < longestName && !isBlank(text[begin - 1]) &&
               !isQuote(text[begin - 1]) && text[begin - 1] != '/') {
            --begin;
        }
        if (const std::size_t quoted = startOfQuoted(text, end); quoted < begin) {
            begin = quoted;
        } else {
            begin = startOfWords(text, begin, least);
        }
        if (begin < end) {
            found.push_back({.begin = begin, .size = end - begin, .kind = SecretKind::file});
            least = end;
        }
    }
}

} // namespace nimbra::mrctl

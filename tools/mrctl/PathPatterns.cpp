#include "tools/mrctl/PathPatterns.h"

#include "tools/mrctl/Characters.h"
#include "tools/mrctl/DocumentNames.h"

#include <algorithm>
#include <array>
#include <system_error>
#include <utility>

namespace nimbra::mrctl {

namespace {

constexpr auto nowhere = std::string_view::npos;

/// What closes that which `before` ends with; empty for what opens nothing.
std::string_view closingOf(std::string_view before) {
    constexpr std::array<std::pair<std::string_view, std::string_view>, 10> pairs{{
        {"\"", "\""},
        {"'", "'"},
        {"`", "`"},
        {"(", ")"},
        {"[", "]"},
        {"<", ">"},
        {"\u201c", "\u201d"},
        {"\u201e", "\u201c"},
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

/// `text` without the domain and the code of an error at its end: " (PlatformErrorDomain 5)".
std::string_view withoutCode(std::string_view text) {
    const std::size_t open = text.rfind(" (");
    if (open == nowhere) {
        return text;
    }
    const std::size_t domain = endOfRun(text, open + 2, isLetter);
    const std::size_t code = domain + (text.substr(domain, 1) == " " ? 1 : 0);
    const std::size_t end = endOfRun(text, code, isDigit);
    const std::string_view name = text.substr(open + 2, domain - open - 2);
    const bool isDomain = name.ends_with("Domain") || name == "POSIX" || name == "SQLite";
    const bool isCode = isDomain && code > domain && end > code && text.substr(end) == ")";
    return isCode ? text.substr(0, open) : text;
}

/// Whether the system says `text` of an error.
bool isSystemMessage(std::string_view text) {
    constexpr int lastError = 133;
    text = withoutCode(text);
    for (int number = 1; number <= lastError; ++number) {
        if (std::generic_category().message(number) == text) {
            return true;
        }
    }
    return false;
}

/// Where the place of an error in a file that is no JSON begins, ": line 1, column 14: not JSON: ",
/// from `begin` on.
std::size_t startOfPlace(std::string_view text, std::size_t begin) {
    constexpr std::string_view line = ": line ";
    constexpr std::string_view column = ", column ";
    for (std::size_t at = text.find(line, begin); at != nowhere; at = text.find(line, at + 1)) {
        const std::size_t behindLine = endOfRun(text, at + line.size(), isDigit);
        if (!text.substr(behindLine).starts_with(column)) {
            continue;
        }
        const std::size_t behind = endOfRun(text, behindLine + column.size(), isDigit);
        if (text.substr(behind).starts_with(": not JSON: ")) {
            return at;
        }
    }
    return nowhere;
}

/// Where the path that begins at `begin` ends at the latest.
std::size_t endOfPath(std::string_view text, std::size_t begin) {
    if (const std::string_view closing = closingOf(text.substr(0, begin)); !closing.empty()) {
        const std::size_t end = text.rfind(closing);
        if (end != nowhere && end > begin) {
            return text[end - 1] == '\\' ? end - 1 : end;
        }
    }
    std::size_t end = text.size();
    if (const std::size_t reason = text.rfind(": ");
        reason != nowhere && reason > begin && isSystemMessage(text.substr(reason + 2))) {
        end = reason;
    }
    // The words of this system for what is wrong with a file.
    for (const std::string_view words :
         {": expected ", ": cannot be ", ": is a ", ": is not ", ": is larger "}) {
        end = std::min(end, text.find(words, begin));
    }
    end = std::min(end, startOfPlace(text, begin));
    while (end > begin &&
           (std::string_view(".,;:!?)]}\\'\"").contains(text[end - 1]) || isBlank(text[end - 1]))) {
        --end;
    }
    return end;
}

bool isIn(std::string_view path, std::string_view place) {
    return path.starts_with(place) && (path.size() == place.size() || path[place.size()] == '/');
}

/// Whether `path` has no name that a user could have given: it goes on with words of letters.
bool isPlain(std::string_view path) {
    return std::ranges::all_of(path, [](char character) {
        return isAlphanumeric(character) || std::string_view("/.-_").contains(character);
    });
}

/// Whether `path`, to its end, says nothing of its user: a place of the system, or one in a JSON
/// document.
bool isEverywhere(std::string_view path) {
    constexpr std::array wholes{"/var/lib/nimbra",
                                "/var/lib/nimbra/accounts.db",
                                "/var/lib/nimbra/consent.db",
                                "/var/lib/nimbra/device.json",
                                "/var/lib/nimbra/device-list.json",
                                "/var/lib/nimbra/documents.json",
                                "/var/lib/nimbra/restrictions.json",
                                "/var/lib/nimbra/preferences",
                                "/var/log/nimbra",
                                "/var/log/nimbra/settings.log",
                                "/var/log/nimbra/settings.1.log",
                                "/var/log/nimbra/settings.2.log",
                                "/run/nimbra",
                                "/run/nimbra/progress",
                                "/run/nimbra/priority-hints",
                                "/run/nimbra/notifications",
                                "/etc/os-release",
                                "/etc/localtime",
                                "/dev/null"};
    constexpr std::array places{
        "/usr/bin",          "/usr/lib",        "/usr/libexec", "/usr/sbin",
        "/usr/share",        "/System/Library", "/containers",  "/abilities",
        "/screen",           "/incompatible",   "/needUpgrade", "/cloudSyncDenied",
        "/lastSyncDate",     "/lastSyncText",   "/name",        "/locale",
        "/timeZone",         "/idiom",          "/identity",    "/wirelessVariant",
        "/description",      "/additional",     "/fraction",    "/indeterminate",
        "/fileOperationKind"};
    if (!isPlain(path) || path.contains("/..")) {
        return false;
    }
    const auto isWhole = [path](const char* whole) { return path == whole; };
    const auto isBelow = [path](const char* place) { return isIn(path, place); };
    if (std::ranges::any_of(wholes, isWhole) || std::ranges::any_of(places, isBelow)) {
        return true;
    }
    // What is of an application is called by its identifier.
    constexpr std::string_view settings = "/var/lib/nimbra/preferences/com.";
    constexpr std::string_view processes = "/run/nimbra/com.";
    return path.starts_with(settings) || path.starts_with(processes);
}

/// Whether `candidate`, with `rest` behind it, is the folder for what a diagnosis makes, or one
/// above it: in a home, but in the same one on every device. Neither a blank nor a letter goes on
/// with it, and of one above, no ": " either.
bool isDiagnosticFolder(std::string_view candidate, std::string_view rest) {
    constexpr std::string_view home = "/var/mobile";
    constexpr std::string_view folder =
        "/var/mobile/Library/Logs/CrashReporter/DiagnosticLogs/Stratafile";
    const bool isEnd = rest.empty() || rest == "." || isQuote(rest[0]) ||
                       std::string_view(")]>").contains(rest[0]) ||
                       (candidate == folder && rest.starts_with(": "));
    return isEnd && isIn(candidate, home) && isIn(folder, candidate);
}

/// The end of the path that begins at `begin` where it says nothing of its user: before ": ", a
/// quotation mark or a blank, without the end of a sentence; `begin` where it does say something.
std::size_t endOfPublicPath(std::string_view text, std::size_t begin, std::size_t skipped) {
    std::size_t end = begin;
    while (end < text.size() && !isBlank(text[end]) && !isQuote(text[end]) &&
           !std::string_view(",;<>)]}:").contains(text[end])) {
        ++end;
    }
    // "/usr/share/a b" may be one path: what follows begins a sentence or another place.
    while (end > begin && text[end - 1] == '.') {
        --end;
    }
    const std::string_view path =
        text.substr(begin + skipped, std::max(end, begin + skipped) - begin - skipped);
    // In a home, a blank may be one of a name.
    const bool isPublic = isEverywhere(path) || isDiagnosticFolder(path, text.substr(end));
    return isPublic ? end : begin;
}

bool canStartName(char character) {
    return isAlphanumeric(character) || isBeyondAscii(character) ||
           std::string_view("._~@+-%$ ").contains(character);
}

/// Where the path begins whose first "/" stands at `slash`; the text's end where none does.
std::size_t startOfPath(std::string_view text, std::size_t slash) {
    std::size_t begin = slash;
    while (begin > 0 && (text[begin - 1] == '.' || text[begin - 1] == '~')) {
        --begin;
    }
    const char before = begin > 0 ? text[begin - 1] : ' ';
    const bool isInside =
        isAlphanumeric(before) || isBeyondAscii(before) || before == '/' || before == '<';
    const bool goesOn = slash + 1 < text.size() && canStartName(text[slash + 1]) &&
                        (text[slash + 1] != ' ' || begin < slash);
    return isInside || !goesOn ? text.size() : begin;
}

/// The beginning of the first place in `text` that only homes have, whatever stands before it.
std::size_t startOfHome(std::string_view text) {
    constexpr std::array<std::string_view, 5> signs{"\\Users\\", "\\home\\", "$HOME", "${HOME}",
                                                    "%USERPROFILE%"};
    constexpr std::string_view home = "/var/mobile";
    constexpr std::array<std::string_view, 7> folders{"home", "Users",   "root",    "media",
                                                      "mnt",  "Volumes", "run/user"};
    constexpr std::size_t longestHost = 64;
    std::size_t first = nowhere;
    for (const std::string_view sign : signs) {
        first = std::min(first, text.find(sign));
    }
    std::size_t mobile = text.find(home);
    while (mobile != nowhere && endOfPublicPath(text, mobile, 0) > mobile) {
        mobile = text.find(home, mobile + 1);
    }
    first = std::min(first, mobile);
    for (const std::string_view folder : folders) {
        first = std::min(first, text.find('/' + std::string(folder) + '/'));
    }
    constexpr std::string_view file = "file:///";
    if (const std::size_t at = text.find(file); at != nowhere) {
        first = std::min(first, at + file.size() - 1);
    }
    for (std::size_t at = 0; at + 2 < text.size() && at < first; ++at) {
        const bool isApart = at == 0 || (!isAlphanumeric(text[at - 1]) && text[at - 1] != '/' &&
                                         !isBeyondAscii(text[at - 1]));
        const std::string_view rest = text.substr(at);
        const bool isDrive = isLetter(rest[0]) && rest[1] == ':' && rest[2] == '\\';
        const bool isNamed = rest[0] == '~' && (isLetter(rest[1]) || rest[1] == '/');
        const bool isShare = rest.starts_with("\\\\") && isAlphanumeric(rest[2]) &&
                             rest.substr(0, longestHost).find('\\', 3) != nowhere &&
                             (at == 0 || text[at - 1] != '\\');
        const bool isRelative = rest.starts_with("home/") || rest.starts_with("Users/");
        if (isApart && (isDrive || isNamed || isShare || isRelative)) {
            return at;
        }
    }
    return first;
}

} // namespace

void findPaths(std::string_view text, std::string_view root, std::vector<FoundSecret>& found) {
    const auto add = [&](std::size_t begin) {
        const std::size_t end = endOfPath(text, begin);
        found.push_back({.begin = begin, .size = end - begin, .kind = SecretKind::path});
        return end;
    };
    for (std::size_t slash = text.find('/'); slash != nowhere; slash = text.find('/', slash + 1)) {
        const std::size_t begin = startOfPath(text, slash);
        if (begin == text.size()) {
            continue;
        }
        const bool isOfRoot = root.size() > 1 && text.substr(begin).starts_with(root);
        const std::string_view behind =
            isOfRoot ? text.substr(begin + root.size()) : std::string_view();
        const bool isRoot =
            isOfRoot && (behind.empty() || std::string_view(": \"'.,)").contains(behind.front()));
        if (const std::size_t end = isRoot
                                        ? begin + root.size()
                                        : endOfPublicPath(text, begin, isOfRoot ? root.size() : 0);
            end > begin) {
            if (isOfRoot) {
                found.push_back({.begin = begin, .size = root.size(), .kind = SecretKind::path});
            }
            slash = std::max(slash, end - 1);
        } else {
            slash = std::max(slash, add(begin) - 1);
        }
    }
    if (const std::size_t home = startOfHome(text); home != nowhere) {
        add(home);
    }
}

PathNames namesInPath(std::string_view path) {
    PathNames names;
    for (const std::string homes : {"/home", "/Users", "/media"}) {
        const std::size_t at = path.find(homes + '/');
        if (at != nowhere) {
            const std::string_view rest = path.substr(at + homes.size() + 1);
            names.user = std::string(rest.substr(0, rest.find_first_of("/ :,;\"'`")));
        }
    }
    std::vector<FoundSecret> documents;
    const std::string_view last = path.substr(path.rfind('/') + 1);
    findDocumentNames(last, documents);
    if (!documents.empty()) {
        names.document =
            std::string(last.substr(0, documents.front().begin + documents.front().size));
    }
    return names;
}

} // namespace nimbra::mrctl

#include "samples/tessary/AppGroups.h"

#include <charconv>
#include <dlfcn.h>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <string_view>

namespace nimbra::samples {

namespace {

/// The folder of this bundle: the one that this very code has been loaded from.
std::filesystem::path ownFolder() {
    static const char place = 0;
    Dl_info object{};
    if (::dladdr(&place, &object) == 0 || object.dli_fname == nullptr) {
        return {};
    }
    return std::filesystem::path(object.dli_fname).parent_path();
}

std::string_view withoutBlanks(std::string_view text) {
    const auto first = text.find_first_not_of(" \t\r\n");
    return first != std::string_view::npos ? text.substr(first) : std::string_view();
}

/// What stands behind `start`, blanks before both left out; empty where something else stands.
std::string_view behind(std::string_view text, std::string_view start) {
    text = withoutBlanks(text);
    return text.starts_with(start) ? withoutBlanks(text.substr(start.size())) : std::string_view();
}

} // namespace

std::optional<std::int64_t> numberOfAppGroups() {
    std::ifstream file(ownFolder() / "app-groups.json");
    const std::string text(std::istreambuf_iterator<char>(file), {});
    const std::string_view number = behind(behind(behind(text, "{"), R"("numAppGroups")"), ":");
    std::int64_t count = 0;
    const auto [end, failure] =
        std::from_chars(number.data(), number.data() + number.size(), count);
    const auto length = static_cast<std::size_t>(end - number.data());
    const std::string_view rest = withoutBlanks(number.substr(length));
    const bool isWhole = rest.starts_with('}') && withoutBlanks(rest.substr(1)).empty();
    return failure == std::errc() && isWhole ? std::optional(count) : std::nullopt;
}

} // namespace nimbra::samples

#include "device/DeviceError.h"

#include <algorithm>
#include <system_error>
#include <unicode/unistr.h>

namespace nimbra::device {

Error deviceError(const std::string& description) {
    return {.domain = "NimbraDevice", .code = 1, .description = oneLine(description)};
}

Error fileError(const std::filesystem::path& path, const std::string& what, int number) {
    const std::string reason = std::generic_category().message(number);
    return {.domain = "POSIX",
            .code = number,
            .description = oneLine(path.string() + ": " + what + ": " + reason)};
}

Error withPath(Error error, const std::filesystem::path& path, std::string_view name) {
    // Descriptions have it in this form.
    const std::string start = oneLine(path.native());
    if (error.description.starts_with(start)) {
        error.description.replace(0, start.size(), name);
    }
    return error;
}

std::string oneLine(std::string_view text) {
    std::string line;
    icu::UnicodeString::fromUTF8(icu::StringPiece(text.data(), static_cast<int>(text.size())))
        .toUTF8String(line);
    std::ranges::replace_if(
        line,
        [](char character) {
            const auto byte = static_cast<unsigned char>(character);
            return byte < 0x20 || byte == 0x7f;
        },
        ' ');
    return line;
}

} // namespace nimbra::device

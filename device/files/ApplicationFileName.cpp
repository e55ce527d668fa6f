#include "device/files/ApplicationFileName.h"

#include "device/files/PercentEncoding.h"

#include <charconv>
#include <cstddef>

namespace nimbra::device {

namespace {

/// Every byte but "/", "%", which marks an encoded one, and control characters.
const std::string& keptBytes() {
    static const std::string kept = [] {
        std::string bytes;
        constexpr int highestByte = 0xFF;
        for (int byte = ' '; byte <= highestByte; ++byte) {
            constexpr int deleteCharacter = 0x7F;
            if (byte != '/' && byte != '%' && byte != deleteCharacter) {
                bytes.push_back(static_cast<char>(byte));
            }
        }
        return bytes;
    }();
    return kept;
}

} // namespace

std::optional<std::string> applicationOfFileName(std::string_view name, std::string_view suffix) {
    if (!name.ends_with(suffix)) {
        return std::nullopt;
    }
    const std::string_view encoded = name.substr(0, name.size() - suffix.size());
    std::string identifier;
    for (std::size_t index = 0; index < encoded.size(); ++index) {
        unsigned int byte = 0;
        if (encoded[index] != '%') {
            identifier += encoded[index];
            continue;
        }
        const std::string_view digits = encoded.substr(index + 1, 2);
        constexpr int hexadecimal = 16;
        const auto read =
            std::from_chars(digits.data(), digits.data() + digits.size(), byte, hexadecimal);
        if (digits.size() != 2 || read.ptr != digits.data() + digits.size()) {
            return std::nullopt;
        }
        identifier += static_cast<char>(byte);
        index += 2;
    }
    // One identifier has one name.
    return applicationFileName(identifier, suffix) == name ? std::optional(identifier)
                                                           : std::nullopt;
}

std::string applicationFileName(std::string_view identifier, std::string_view suffix) {
    return percentEncoded(identifier, keptBytes()).append(suffix);
}

} // namespace nimbra::device

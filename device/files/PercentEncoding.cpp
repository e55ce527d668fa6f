#include "device/files/PercentEncoding.h"

namespace nimbra::device {

std::string percentEncoded(std::string_view text, std::string_view kept) {
    constexpr std::string_view digits = "0123456789ABCDEF";
    constexpr std::string_view plain = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ"
                                       "0123456789-_";
    std::string encoded;
    for (const char character : text) {
        const bool isInnerDot = character == '.' && !encoded.empty();
        if (plain.contains(character) || kept.contains(character) || isInnerDot) {
            encoded += character;
        } else {
            const auto byte = static_cast<unsigned char>(character);
            encoded += '%';
            encoded += digits[byte / 16U];
            encoded += digits[byte % 16U];
        }
    }
    return encoded;
}

} // namespace nimbra::device

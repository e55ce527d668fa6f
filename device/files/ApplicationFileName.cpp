#include "device/files/ApplicationFileName.h"

#include "device/files/PercentEncoding.h"

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

std::string applicationFileName(std::string_view identifier, std::string_view suffix) {
    return percentEncoded(identifier, keptBytes()).append(suffix);
}

} // namespace nimbra::device

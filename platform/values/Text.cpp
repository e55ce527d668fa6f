#include "platform/values/Text.h"

#include <utility>

namespace nimbra {

Text::Text(std::string utf8) : _string(std::make_shared<const std::string>(std::move(utf8))) {}

Text::Text(std::string_view utf8) : Text(std::string(utf8)) {}

Text::Text(const char* utf8) : Text(std::string(utf8)) {}

const std::string& Text::string() const {
    static const std::string empty;
    return _string ? *_string : empty;
}

std::ostream& operator<<(std::ostream& out, const Text& text) {
    return text ? out << '"' << text.string() << '"' : out << "absent";
}

} // namespace nimbra

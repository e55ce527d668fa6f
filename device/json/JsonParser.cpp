#include "device/json/JsonParser.h"

#include "device/DeviceError.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <set>
#include <utility>
#include <vector>

namespace nimbra::device {

namespace {

using Json = nlohmann::ordered_json;

// Printing and destroying a document recurse, so its depth is bounded before it is built.
constexpr std::size_t deepestNesting = 100;

/// "line 3, column 7" for the place that is `position` bytes into `text`.
std::string lineAndColumn(std::string_view text, std::size_t position) {
    const std::string_view before = text.substr(0, position);
    const auto lineStart = before.rfind('\n') + 1; // npos + 1 is the start of the text
    const auto isCharacterStart = [](char byte) {
        return (static_cast<unsigned char>(byte) & 0xC0U) != 0x80U;
    };
    const auto line = 1 + std::ranges::count(before, '\n');
    const auto column = 1 + std::ranges::count_if(before.substr(lineStart), isCharacterStart);
    return "line " + std::to_string(line) + ", column " + std::to_string(column);
}

/// The parser's message without its heading, the place and the text that it read last.
std::string shortReason(const std::string& message) {
    auto start = message.find("parse error at line");
    start = message.find(start == std::string::npos ? "] " : ": ",
                         start == std::string::npos ? 0 : start);
    const std::string reason = start == std::string::npos ? message : message.substr(start + 2);
    return reason.substr(0, reason.find("; last read: "));
}

/// Builds the document from what the parser reads, and stops it at the first thing wrong.
class DocumentBuilder final : public nlohmann::json_sax<Json> {
public:
    DocumentBuilder(std::string_view text, const std::string& name) : _text(text), _name(name) {}

    [[nodiscard]] Json takeRoot() { return std::move(_root); }
    [[nodiscard]] const Error& error() const { return _error; }

    bool null() override { return add(nullptr); }
    bool boolean(bool value) override { return add(value); }
    bool number_integer(number_integer_t value) override { return add(value); }
    bool number_unsigned(number_unsigned_t value) override { return add(value); }
    bool number_float(number_float_t value, const string_t& /*token*/) override {
        return add(value);
    }
    bool string(string_t& value) override { return add(std::move(value)); }
    bool binary(binary_t& /*value*/) override { return false; }

    bool start_object(std::size_t /*elements*/) override { return open(Json::object()); }
    bool end_object() override { return close(); }
    bool start_array(std::size_t /*elements*/) override { return open(Json::array()); }
    bool end_array() override { return close(); }

    bool key(string_t& value) override {
        Container& container = _open.back();
        container.key = value;
        if (!container.keys.insert(value).second) {
            return fail(place() + ": the key is given twice");
        }
        return true;
    }

    bool parse_error(std::size_t position, const std::string& /*token*/,
                     const nlohmann::detail::exception& exception) override {
        const std::size_t offset = position > 0 ? position - 1 : 0;
        return fail(lineAndColumn(_text, offset) + ": not JSON: " + shortReason(exception.what()));
    }

private:
    struct Container {
        Json* json;
        std::string key;
        std::set<std::string> keys;
    };

    bool fail(const std::string& what) {
        _error = deviceError(_name + ": " + what);
        return false;
    }

    /// The pointer of the member that is being read.
    [[nodiscard]] std::string place() const {
        std::string pointer;
        for (const Container& container : _open) {
            // What is being read of an array is its last element so far.
            pointer +=
                '/' + (container.json->is_object() ? escapedForJsonPointer(container.key)
                                                   : std::to_string(container.json->size() - 1));
        }
        return pointer;
    }

    /// Puts `value` where the parser stands.
    Json* put(Json value) {
        if (_open.empty()) {
            _root = std::move(value);
            return &_root;
        }
        Container& container = _open.back();
        if (container.json->is_array()) {
            auto& elements = container.json->get_ref<Json::array_t&>();
            elements.push_back(std::move(value));
            return &elements.back();
        }
        // The keys are known to differ, so the search that `emplace` makes is not needed.
        auto& members = container.json->get_ref<Json::object_t&>();
        members.Json::object_t::Container::emplace_back(container.key, std::move(value));
        return &members.back().second;
    }

    bool add(Json value) {
        put(std::move(value));
        return true;
    }

    bool open(Json container) {
        if (_open.size() == deepestNesting) {
            return fail("the values are nested more than " + std::to_string(deepestNesting) +
                        " deep");
        }
        _open.push_back({put(std::move(container)), {}, {}});
        return true;
    }

    bool close() {
        _open.pop_back();
        return true;
    }

    std::string_view _text;
    const std::string& _name;
    Json _root;
    std::vector<Container> _open;
    Error _error;
};

} // namespace

std::expected<Json, Error> parseJson(std::string_view text, const std::string& name) {
    DocumentBuilder builder(text, name);
    if (!Json::sax_parse(text, &builder)) {
        return std::unexpected(builder.error());
    }
    return builder.takeRoot();
}

std::string escapedForJsonPointer(const std::string& token) {
    std::string escaped;
    for (const char character : token) {
        if (character == '~') {
            escaped += "~0";
        } else if (character == '/') {
            escaped += "~1";
        } else {
            escaped += character;
        }
    }
    return escaped;
}

} // namespace nimbra::device

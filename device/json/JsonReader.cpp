#include "device/json/JsonReader.h"

#include "device/DeviceError.h"
#include "device/files/PlainFile.h"
#include "device/json/JsonParser.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <utility>

namespace nimbra::device {

namespace {

using Json = nlohmann::ordered_json;

/// `value` as it stands in a message: printed on one line and not long.
std::string excerpt(const Json* value) {
    if (value == nullptr) {
        return "nothing";
    }
    constexpr std::size_t longest = 60;
    std::string text = value->dump(-1, ' ', false, Json::error_handler_t::replace);
    if (text.size() <= longest) {
        return text;
    }
    std::size_t end = longest;
    while (end > 0 && (static_cast<unsigned char>(text[end]) & 0xC0U) == 0x80U) {
        --end;
    }
    return text.substr(0, end) + "...";
}

} // namespace

struct JsonReader::Document {
    std::string name;
    Json root;
    std::optional<Error> problem;
};

JsonReader::JsonReader(std::shared_ptr<Document> document, const Json* value, std::string pointer)
    : _document(std::move(document)), _value(value), _pointer(std::move(pointer)) {}

std::expected<JsonReader, Error> JsonReader::parse(std::string_view text, const std::string& name) {
    auto root = parseJson(text, name);
    if (!root) {
        return std::unexpected(root.error());
    }
    auto document = std::make_shared<Document>(name, std::move(*root), std::nullopt);
    const Json* value = &document->root;
    return JsonReader(std::move(document), value, "");
}

std::expected<JsonReader, Error> JsonReader::readFile(const std::filesystem::path& path) {
    const auto text = readPlainFile(path);
    if (!text) {
        return std::unexpected(text.error());
    }
    return parse(*text, path.string());
}

std::optional<Error> JsonReader::problem() const {
    return _document->problem;
}

bool JsonReader::isAbsent() const {
    return _value == nullptr;
}

bool JsonReader::isNull() const {
    return _value == nullptr || _value->is_null();
}

bool JsonReader::isObject() const {
    return _value != nullptr && _value->is_object();
}

bool JsonReader::isString() const {
    return _value != nullptr && _value->is_string();
}

bool JsonReader::isBoolean() const {
    return _value != nullptr && _value->is_boolean();
}

bool JsonReader::boolean(bool fallback) const {
    if (isAbsent()) {
        return fallback;
    }
    if (!_value->is_boolean()) {
        expected("true or false");
        return fallback;
    }
    return _value->get<bool>();
}

std::int64_t JsonReader::integer(std::int64_t fallback) const {
    if (isAbsent()) {
        return fallback;
    }
    const bool fits = _value->is_number_unsigned()
                          ? std::in_range<std::int64_t>(_value->get<std::uint64_t>())
                          : _value->is_number_integer();
    if (!fits) {
        expected("an integer");
        return fallback;
    }
    return _value->get<std::int64_t>();
}

double JsonReader::number(double fallback) const {
    if (isAbsent()) {
        return fallback;
    }
    if (!_value->is_number()) {
        expected("a number");
        return fallback;
    }
    return _value->get<double>();
}

std::string JsonReader::string(const std::string& fallback) const {
    if (isAbsent()) {
        return fallback;
    }
    if (!_value->is_string()) {
        expected("a string");
        return fallback;
    }
    return _value->get<std::string>();
}

std::optional<std::string> JsonReader::stringOrNull() const {
    if (isNull()) {
        return std::nullopt;
    }
    if (!_value->is_string()) {
        expected("a string or null");
        return std::nullopt;
    }
    return _value->get<std::string>();
}

std::vector<JsonReader> JsonReader::elements() const {
    std::vector<JsonReader> readers;
    if (isAbsent()) {
        return readers;
    }
    if (!_value->is_array()) {
        expected("an array");
        return readers;
    }
    readers.reserve(_value->size());
    for (const Json& element : *_value) {
        const std::string index = std::to_string(readers.size());
        readers.push_back(JsonReader(_document, &element, _pointer + '/' + index));
    }
    return readers;
}

JsonReader JsonReader::member(const std::string& key) const {
    const Json* value = nullptr;
    if (isObject()) {
        if (const auto entry = _value->find(key); entry != _value->end()) {
            value = &*entry;
        }
    } else if (!isAbsent()) {
        expected("an object");
    }
    return {_document, value, _pointer + '/' + escapedForJsonPointer(key)};
}

std::vector<std::string> JsonReader::keys() const {
    std::vector<std::string> keys;
    if (isObject()) {
        for (const auto& entry : _value->items()) {
            keys.push_back(entry.key());
        }
    } else if (!isAbsent()) {
        expected("an object");
    }
    return keys;
}

void JsonReader::allowOnly(std::initializer_list<std::string_view> known) const {
    for (const std::string& key : keys()) {
        if (std::ranges::find(known, key) == known.end()) {
            std::string list;
            for (const std::string_view name : known) {
                list += list.empty() ? "" : ", ";
                list += name;
            }
            member(key).note("unknown key; expected one of " + list);
            return;
        }
    }
}

const Json& JsonReader::value() const {
    static const Json null;
    return _value != nullptr ? *_value : null;
}

void JsonReader::expected(const std::string& expected) const {
    if (!_document->problem) {
        note("expected " + expected + ", found " + excerpt(_value));
    }
}

void JsonReader::note(const std::string& what) const {
    if (!_document->problem) {
        const std::string place = _pointer.empty() ? "/" : _pointer;
        _document->problem = deviceError(_document->name + ": " + place + ": " + what);
    }
}

} // namespace nimbra::device

#include "device/system/NotificationMessage.h"

#include "device/json/JsonReader.h"

#include <array>
#include <charconv>
#include <memory>
#include <nlohmann/json.hpp>
#include <system_error>
#include <utility>
#include <variant>

namespace nimbra::device {

namespace {

using Json = nlohmann::ordered_json;

/// A value under the name of its type. A number is a text, as JSON has no infinite ones; a date
/// counts microseconds since 1970.
struct Encoder {
    Json operator()(std::monostate /*nothing*/) const { return nullptr; }
    Json operator()(const std::shared_ptr<Account>& /*account*/) const { return nullptr; }
    Json operator()(bool value) const { return {{"boolean", value}}; }
    Json operator()(std::int64_t value) const { return {{"integer", value}}; }
    Json operator()(double value) const {
        std::array<char, 32> digits{}; // the shortest form that reads back the same has 24 at most
        const char* const end = std::to_chars(digits.begin(), digits.end(), value).ptr;
        return {{"number", std::string(digits.cbegin(), end)}};
    }
    Json operator()(const Text& value) const {
        return {{"text", value ? Json(value.string()) : Json(nullptr)}};
    }
    Json operator()(Date value) const {
        return {{"date", std::chrono::microseconds(value.time_since_epoch()).count()}};
    }
};

double parseNumber(const JsonReader& reader) {
    const std::string digits = reader.string();
    double value = 0;
    const char* const end = std::to_address(digits.end());
    const auto parsed = std::from_chars(digits.data(), end, value);
    if (parsed.ec != std::errc() || parsed.ptr != end) {
        reader.expected("the digits of a number");
    }
    return value;
}

UserInfoValue parseValue(const JsonReader& reader) {
    const auto types = reader.keys();
    if (types.size() != 1) {
        reader.expected("one value under the name of its type");
        return {};
    }
    const std::string& type = types.front();
    const JsonReader value = reader.member(type);
    if (type == "boolean") {
        return value.boolean();
    }
    if (type == "integer") {
        return value.integer();
    }
    if (type == "number") {
        return parseNumber(value);
    }
    if (type == "text") {
        const auto text = value.stringOrNull();
        return text ? Text(*text) : Text();
    }
    if (type == "date") {
        return Date(std::chrono::microseconds(value.integer()));
    }
    reader.expected("a value of a known type");
    return {};
}

} // namespace

Notification distributable(const Notification& notification) {
    Notification result{.name = notification.name};
    for (const auto& [key, value] : notification.userInfo) {
        if (!std::holds_alternative<std::monostate>(value) &&
            !std::holds_alternative<std::shared_ptr<Account>>(value)) {
            result.userInfo.emplace(key, value);
        }
    }
    return result;
}

std::string notificationMessage(const Notification& notification) {
    Json userInfo = Json::object();
    for (const auto& [key, value] : notification.userInfo) {
        userInfo[key.string()] = std::visit(Encoder(), value);
    }
    const Json message{{"name", notification.name.string()}, {"userInfo", std::move(userInfo)}};
    return message.dump(-1, ' ', false, Json::error_handler_t::replace);
}

std::expected<Notification, Error> parseNotificationMessage(std::string_view message) {
    const auto reader = JsonReader::parse(message, "notification");
    if (!reader) {
        return std::unexpected(reader.error());
    }
    reader->allowOnly({"name", "userInfo"});
    Notification notification{.name = NotificationName(reader->member("name").string())};
    if (notification.name.string().empty()) {
        reader->member("name").expected("the name of a notification");
    }
    const JsonReader userInfo = reader->member("userInfo");
    for (const std::string& key : userInfo.keys()) {
        notification.userInfo.emplace(UserInfoKey(key), parseValue(userInfo.member(key)));
    }
    if (auto problem = reader->problem()) {
        return std::unexpected(std::move(*problem));
    }
    return notification;
}

} // namespace nimbra::device

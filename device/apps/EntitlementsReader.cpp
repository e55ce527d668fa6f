#include "device/apps/EntitlementsReader.h"

#include "device/json/JsonReader.h"

#include <nlohmann/json.hpp>
#include <utility>

namespace nimbra::device {

namespace {

using Json = nlohmann::ordered_json;

EntitlementValue valueOf(const Json& json);

EntitlementValue numberOf(const Json& json) {
    const bool fits = json.is_number_unsigned()
                          ? std::in_range<std::int64_t>(json.get<std::uint64_t>())
                          : json.is_number_integer();
    return fits ? EntitlementValue{json.get<std::int64_t>()} : EntitlementValue{json.get<double>()};
}

// NOLINTNEXTLINE(misc-no-recursion): the reader bounds the depth
EntitlementValue arrayOf(const Json& json) {
    EntitlementArray elements;
    elements.reserve(json.size());
    for (const Json& element : json) {
        elements.push_back(valueOf(element));
    }
    return {std::move(elements)};
}

// NOLINTNEXTLINE(misc-no-recursion): the reader bounds the depth
EntitlementValue dictionaryOf(const Json& json) {
    EntitlementDictionary members;
    members.reserve(json.size());
    for (const auto& [key, value] : json.items()) {
        members.push_back({key, valueOf(value)});
    }
    return {std::move(members)};
}

// NOLINTNEXTLINE(misc-no-recursion): the reader bounds the depth
EntitlementValue valueOf(const Json& json) {
    if (json.is_boolean()) {
        return {json.get<bool>()};
    }
    if (json.is_number()) {
        return numberOf(json);
    }
    if (json.is_string()) {
        return {json.get<std::string>()};
    }
    if (json.is_array()) {
        return arrayOf(json);
    }
    return json.is_object() ? dictionaryOf(json) : EntitlementValue{};
}

} // namespace

std::expected<Entitlements, Error> readEntitlements(std::string_view json) {
    const auto reader = JsonReader::parse(json, "entitlements");
    if (!reader) {
        return std::unexpected(reader.error());
    }
    if (!reader->isObject()) {
        reader->expected("an object");
        return std::unexpected(*reader->problem());
    }
    Entitlements entitlements;
    for (const auto& [key, value] : reader->value().items()) {
        entitlements.emplace(key, valueOf(value));
    }
    return entitlements;
}

} // namespace nimbra::device

#include "host/core/RowDescription.h"

#include "platform/system/ClassRegistry.h"

#include <nlohmann/json.hpp>
#include <type_traits>
#include <variant>

namespace nimbra::host {

namespace {

RowKind kindOf(CellType cell) {
    switch (cell) {
    case GroupCell:
        return RowKind::group;
    case LinkListCell:
        return RowKind::link;
    case SwitchCell:
        return RowKind::switchRow;
    case ButtonCell:
        return RowKind::button;
    }
    return RowKind::group;
}

/// A row may name an application without wanting its icon.
Text iconOf(const Specifier& row) {
    return boolValue(row.propertyForKey(LazyIconLoading))
               ? textValue(row.propertyForKey(LazyIconAppID))
               : Text();
}

} // namespace

std::string kindName(RowKind kind) {
    switch (kind) {
    case RowKind::group:
        return "group";
    case RowKind::switchRow:
        return "switch";
    case RowKind::link:
        return "link";
    case RowKind::button:
        return "button";
    }
    return {};
}

RowDescription RowDescription::of(const Specifier& row) {
    RowDescription description = withoutValue(row);
    description.value = row.value();
    return description;
}

RowDescription RowDescription::withoutValue(const Specifier& row) {
    const ControllerClass* detail = row.detailControllerClass();
    return {.kind = kindOf(row.cellType()),
            .id = row.identifier(),
            .name = row.name(),
            .enabled = row.isEnabled(),
            .value = {},
            .footer = textValue(row.propertyForKey(FooterTextGroupKey)),
            .footerClass = textValue(row.propertyForKey(FooterCellClassGroupKey)),
            .icon = iconOf(row),
            .detail = detail != nullptr ? std::optional(detail->name) : std::nullopt};
}

std::vector<RowDescription> RowDescription::of(const SpecifierArray& rows) {
    std::vector<RowDescription> descriptions;
    descriptions.reserve(rows.size());
    for (const auto& row : rows) {
        descriptions.push_back(of(*row));
    }
    return descriptions;
}

nlohmann::ordered_json RowDescription::json() const {
    nlohmann::ordered_json object;
    object["kind"] = kindName(kind);
    object["id"] = jsonOf(id);
    object["name"] = jsonOf(name);
    object["enabled"] = enabled;
    object["value"] = jsonOf(value);
    object["footer"] = jsonOf(footer);
    object["footerClass"] = jsonOf(footerClass);
    object["icon"] = jsonOf(icon);
    object["detail"] = detail ? nlohmann::ordered_json(*detail) : nlohmann::ordered_json();
    return object;
}

std::string displayedValue(const RowValue& value) {
    if (const bool* isOn = std::get_if<bool>(&value)) {
        return *isOn ? "on" : "off";
    }
    if (const auto* number = std::get_if<std::int64_t>(&value)) {
        return std::to_string(*number);
    }
    return textValue(value).string();
}

nlohmann::ordered_json jsonOf(const Text& text) {
    return text ? nlohmann::ordered_json(text.string()) : nlohmann::ordered_json();
}

nlohmann::ordered_json jsonOf(const RowValue& value) {
    if (const bool* isOn = std::get_if<bool>(&value)) {
        return *isOn;
    }
    if (const auto* number = std::get_if<std::int64_t>(&value)) {
        return *number;
    }
    return jsonOf(textValue(value));
}

} // namespace nimbra::host

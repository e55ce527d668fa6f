#include "platform/host/Specifier.h"

#include <algorithm>
#include <utility>

namespace nimbra {

Specifier::Specifier(Text identifier, Text name, Row row)
    : _identifier(std::move(identifier)), _name(std::move(name)), _row(std::move(row)) {}

std::shared_ptr<Specifier> Specifier::groupSpecifierWithID(Text identifier) {
    return std::shared_ptr<Specifier>(
        new Specifier(std::move(identifier), Text(), {.cell = GroupCell}));
}

std::shared_ptr<Specifier> Specifier::preferenceSpecifierNamed(Text name, Row row) {
    return std::shared_ptr<Specifier>(new Specifier(Text(), std::move(name), std::move(row)));
}

void Specifier::setIdentifier(Text identifier) {
    _identifier = std::move(identifier);
}

const Text& Specifier::label() const {
    return _identifier ? _identifier : _name;
}

RowValue Specifier::propertyForKey(const PropertyKey& key) const {
    const auto entry =
        std::ranges::find(_properties, key, &decltype(_properties)::value_type::first);
    return entry != _properties.end() ? entry->second : RowValue();
}

void Specifier::setPropertyForKey(RowValue value, const PropertyKey& key) {
    const auto entry =
        std::ranges::find(_properties, key, &decltype(_properties)::value_type::first);
    if (entry != _properties.end()) {
        entry->second = std::move(value);
    } else {
        _properties.emplace_back(key, std::move(value));
    }
}

void Specifier::setUserInfo(UserInfo userInfo) {
    _userInfo = std::move(userInfo);
}

bool Specifier::isEnabled() const {
    return propertyForKey(EnabledKey) != RowValue(false);
}

RowValue Specifier::value() const {
    return _row.get ? _row.get(*this) : RowValue();
}

void Specifier::setValue(const RowValue& value) {
    if (_row.set) {
        _row.set(value, shared_from_this());
    }
}

void Specifier::setButtonAction(Action action) {
    _buttonAction = std::move(action);
}

void Specifier::performButtonAction() {
    if (_buttonAction) {
        _buttonAction(shared_from_this());
    }
}

} // namespace nimbra

#include "device/system/DeviceAbilities.h"

#include "device/system/DeviceSettings.h"

namespace nimbra::device {

DeviceAbilities::DeviceAbilities(const DeviceSettings& settings) : _settings(settings) {}

bool DeviceAbilities::boolAnswerForQuestion(const Text& question) const {
    return question == Text("cellular-data") && _settings.hasCellularData();
}

Text DeviceAbilities::copyAnswerForQuestion(const Text& question) const {
    return question == Text("UserAssignedDeviceName") ? Text(_settings.name()) : Text();
}

Text DeviceAbilities::VariantStringKeyForKey(const Text& key) const {
    const auto variant = _settings.wirelessVariant();
    return variant ? Text(key.string() + '_' + *variant) : key;
}

UserInterfaceIdiom DeviceAbilities::userInterfaceIdiom() const {
    return _settings.userInterfaceIdiom();
}

std::optional<Screen> DeviceAbilities::mainScreen() const {
    return _settings.mainScreen();
}

} // namespace nimbra::device

#pragma once

#include "platform/values/Text.h"

#include <QString>
#include <string>

namespace nimbra::window {

/// `text`, in which bytes that are not UTF-8 become the replacement character.
inline QString qString(const std::string& text) {
    return QString::fromStdString(text);
}
/// Empty for an absent text.
inline QString qString(const Text& text) {
    return qString(text.string());
}

} // namespace nimbra::window

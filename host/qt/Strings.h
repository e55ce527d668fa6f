#pragma once

#include "platform/values/Text.h"

#include <QString>
#include <string>

namespace nimbra::window {

/// What is no UTF-8 becomes the sign for that.
inline QString qString(const std::string& text) {
    return QString::fromStdString(text);
}
/// Empty for an absent text.
inline QString qString(const Text& text) {
    return qString(text.string());
}

} // namespace nimbra::window

#pragma once

#include "platform/system/NotificationCenter.h"
#include "platform/values/Error.h"

#include <cstddef>
#include <expected>
#include <string>
#include <string_view>

namespace nimbra::device {

/// The longest message that goes from process to process, in bytes.
inline constexpr std::size_t longestNotificationMessage = 64UL * 1024UL;

/// `notification` without what stays in its process: the sender, and all user info but booleans,
/// numbers, texts and dates.
[[nodiscard]] Notification distributable(const Notification& notification);

/// A distributable notification as one JSON object, of any length. Nothing of it is rounded; bytes
/// of a text that are not UTF-8 become the replacement character.
[[nodiscard]] std::string notificationMessage(const Notification& notification);

/// The notification in `message`; anything else is an error.
[[nodiscard]] std::expected<Notification, Error> parseNotificationMessage(std::string_view message);

} // namespace nimbra::device

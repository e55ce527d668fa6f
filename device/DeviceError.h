#pragma once

#include "platform/values/Error.h"

#include <filesystem>
#include <string>
#include <string_view>

namespace nimbra::device {

/// An error of the device itself; `description` names the file and the place.
[[nodiscard]] Error deviceError(const std::string& description);

/// "`path`: `what`: the words of the system for `number`", where `number` is an errno.
[[nodiscard]] Error fileError(const std::filesystem::path& path, const std::string& what,
                              int number);

/// `error`, where its description begins with `path`, with `name` in the path's place.
[[nodiscard]] Error withPath(Error error, const std::filesystem::path& path, std::string_view name);

/// `text` as it can stand in one line of a log or a terminal: control characters of ASCII become
/// spaces, bytes that are not UTF-8 the replacement character.
[[nodiscard]] std::string oneLine(std::string_view text);

} // namespace nimbra::device

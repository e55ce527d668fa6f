#pragma once

#include "platform/values/Error.h"

#include <cstddef>
#include <expected>
#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <sys/types.h>
#include <vector>

namespace nimbra::device {

/// Nothing that somebody describes comes anywhere near it; a device that never ends passes it.
inline constexpr std::size_t kMostBytesOfInput = 64'000'000;

/// Everything in the file at `path`, which may also be a pipe: for what the user names. One with
/// more than `kMostBytesOfInput` is an error. What stands on a device is read with `readPlainFile`.
[[nodiscard]] std::expected<std::string, Error> readFile(const std::filesystem::path& path);

/// The same for standard input, read up to its end; messages call it "standard input".
[[nodiscard]] std::expected<std::string, Error> readStandardInput();

/// Makes `content` the whole content of the file at `path`, whose directory exists: it is written
/// under a temporary name, flushed and renamed, so that a reader, and a machine that stops, see
/// the earlier content or the new one. On an error the earlier content stays, unless it is only
/// the renaming that cannot be flushed, and nothing is left beside it. The file has `permissions`,
/// or where none are given those that it had, a new one those that let everybody read it.
[[nodiscard]] std::expected<void, Error>
writeFileAtomically(const std::filesystem::path& path, std::string_view content,
                    std::optional<mode_t> permissions = std::nullopt);

/// Makes files in `directory` that do not stand there yet, each with the content that `files` has
/// under its name, and flushes them, where there are many together. On an error some may be left:
/// for directories that are built out of sight. The directory itself is not flushed.
[[nodiscard]] std::expected<void, Error>
writeNewFiles(const std::filesystem::path& directory,
              const std::map<std::string, std::string>& files);

/// What stands in `directory`, sorted by name: of several mistakes always the same is met first.
[[nodiscard]] std::expected<std::vector<std::filesystem::path>, Error>
entriesOfDirectory(const std::filesystem::path& directory);

/// Flushes the entries of `directory` to the disk.
[[nodiscard]] std::expected<void, Error>
synchronizeDirectory(const std::filesystem::path& directory);

} // namespace nimbra::device

#pragma once

#include <expected>
#include <filesystem>
#include <optional>
#include <string>
#include <sys/types.h>

namespace nimbra::host {

// Ways to share a file of this machine. A failure is told in one line.

/// A path as a person types it, where "~" alone or before "/" is the user's own folder; as it is
/// where nobody knows which that is.
[[nodiscard]] std::filesystem::path withHome(const std::string& typed);

/// Copies `file` to `target`, or under its own name into `target` where that is a folder; the copy
/// is for its owner's eyes only. What stands there already is never replaced, and nothing is left
/// of a copy that fails. Gives back where the copy is, as an absolute path.
[[nodiscard]] std::expected<std::filesystem::path, std::string>
copyFile(const std::filesystem::path& file, const std::filesystem::path& target);

/// The desktop's program that begins a mail, among the user's programs; nothing where there is
/// none.
[[nodiscard]] std::optional<std::filesystem::path> findMailProgram();

/// Has `program` begin a mail with `file` in it, without waiting for it. Gives back the process,
/// a child of this one, which `awaitMail` is then called for.
[[nodiscard]] std::expected<pid_t, std::string> beginMail(const std::filesystem::path& program,
                                                          const std::filesystem::path& file);

/// Waits until the `process` of `program` has ended, and takes its status: whether the mail was
/// begun. Who must not wait watches the process and calls this at its end.
[[nodiscard]] std::expected<void, std::string> awaitMail(const std::filesystem::path& program,
                                                         pid_t process);

/// Has `program` begin a mail with `file` in it, and waits until it has.
[[nodiscard]] std::expected<void, std::string> handToMail(const std::filesystem::path& program,
                                                          const std::filesystem::path& file);

} // namespace nimbra::host

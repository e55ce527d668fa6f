#pragma once

#include <array>
#include <cstddef>
#include <string_view>

namespace nimbra::mrctl {

/// What a value is that does not leave the device. A pseudonym begins with the kind's name.
enum class SecretKind {
    account,
    email,
    device,
    container,
    identity,
    user,
    file,
    path,
    /// What somebody wrote or reads, which may name anything.
    text,
    /// Passwords, tokens and keys.
    secret
};

inline constexpr std::array<std::string_view, 10> kSecretKindNames{
    "account", "email", "device", "container", "identity",
    "user",    "file",  "path",   "text",      "secret"};

[[nodiscard]] constexpr std::string_view nameOf(SecretKind kind) {
    return kSecretKindNames.at(static_cast<std::size_t>(kind));
}

} // namespace nimbra::mrctl

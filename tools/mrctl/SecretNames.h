#pragma once

#include "tools/mrctl/SecretKind.h"

#include <array>
#include <optional>
#include <string_view>

namespace nimbra::mrctl {

/// Words for a password, in small letters. What follows one is taken for a password even where
/// nothing but a blank stands between.
inline constexpr std::array<std::string_view, 40> kPasswordWords{"password",
                                                                 "passwort",
                                                                 "passwd",
                                                                 "passphrase",
                                                                 "passcode",
                                                                 "pwd",
                                                                 "kennwort",
                                                                 "kennw\u00f6rt",
                                                                 "mot de passe",
                                                                 "motdepasse",
                                                                 "mot_de_passe",
                                                                 "contrase\u00f1a",
                                                                 "contrasena",
                                                                 "contrase\u00d1a",
                                                                 "senha",
                                                                 "palavra-passe",
                                                                 "palavra passe",
                                                                 "wachtwoord",
                                                                 "l\u00f6senord",
                                                                 "losenord",
                                                                 "L\u00d6SENORD",
                                                                 "l\u00d6senord",
                                                                 "parola d'ordine",
                                                                 "parola",
                                                                 "adgangskode",
                                                                 "пароль",
                                                                 "Пароль",
                                                                 "ПАРОЛЬ",
                                                                 "密码",
                                                                 "密碼",
                                                                 "口令",
                                                                 "パスワード",
                                                                 "ﾊﾟｽﾜｰﾄﾞ",
                                                                 "暗証番号",
                                                                 "비밀번호",
                                                                 "암호",
                                                                 "كلمة المرور",
                                                                 "كلمة السر",
                                                                 "رمز المرور",
                                                                 "лозинка"};

/// What a value is whose key or variable is called `name`; nothing where the name does not tell.
/// "deviceName", "device_name" and "DEVICE-NAME" are the same name; of one with dots, the last part
/// tells.
[[nodiscard]] std::optional<SecretKind> kindOfValueNamed(std::string_view name);

/// The last word of `name`, in small letters: "code" of "errorCode".
[[nodiscard]] std::string lastWordOf(std::string_view name);

} // namespace nimbra::mrctl

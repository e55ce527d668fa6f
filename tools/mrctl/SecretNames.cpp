#include "tools/mrctl/SecretNames.h"

#include "tools/mrctl/Characters.h"

#include <algorithm>
#include <array>
#include <span>
#include <string>
#include <vector>

namespace nimbra::mrctl {

namespace {

using Words = std::span<const std::string_view>;

/// Wherever they stand in a name, without the signs in it.
constexpr std::array<std::string_view, 15> secretParts{
    "secret",        "token",      "apikey",    "accesskey",  "privatekey",
    "encryptionkey", "authoriz",   "cookie",    "sessionid",  "signature",
    "bearer",        "credential", "clientkey", "accesscode", "recovery"};
constexpr std::array<std::string_view, 29> secretWords{
    "pass", "pw",   "psw",   "auth",   "session", "sid",   "sig",   "key",     "pin",   "otp",
    "totp", "code", "hash",  "salt",   "jwt",     "cred",  "creds", "tan",     "nonce", "csrf",
    "seed", "mdp",  "clave", "contra", "haslo",   "sifre", "kod",   "passkey", "mfa"};
constexpr std::array<std::string_view, 11> addressWords{"phone",  "email", "mail", "msisdn",
                                                        "imei",   "iban",  "tel",  "telephone",
                                                        "mobile", "ssid",  "bssid"};
constexpr std::array<std::string_view, 12> personWords{
    "name",  "nickname", "contact",  "user",      "owner",       "username",
    "login", "fullname", "lastname", "firstname", "displayname", "uid"};
constexpr std::array<std::string_view, 6> fileWords{"filename", "title", "document",
                                                    "folder",   "file",  "recent"};
constexpr std::array<std::string_view, 3> folderWords{"folder", "recent", "title"};
constexpr std::array<std::string_view, 5> accountNames{"account", "accountname", "accountid",
                                                       "accountidentifier", "konto"};
constexpr std::array<std::string_view, 6> deviceNames{"device",   "devicename",   "host",
                                                      "hostname", "computername", "machinename"};

/// The words of `name`, in small letters: signs, digits and capitals begin one.
std::vector<std::string> wordsOf(std::string_view name) {
    std::vector<std::string> words;
    bool isInside = false;
    for (std::size_t index = 0; index < name.size(); ++index) {
        if (!isLetter(name[index])) {
            isInside = false;
            continue;
        }
        const bool isBehindSmall = index > 0 && isLower(name[index - 1]);
        // The last capital of several begins a word: "SSIDName".
        const bool isBeforeSmall = index > 0 && isUpper(name[index - 1]) &&
                                   index + 1 < name.size() && isLower(name[index + 1]);
        if (!isInside || (isUpper(name[index]) && (isBehindSmall || isBeforeSmall))) {
            words.emplace_back();
        }
        isInside = true;
        words.back() += lowerCase(name.substr(index, 1));
    }
    return words;
}

bool isIn(Words list, const std::string& word) {
    const auto has = [list](std::string_view text) {
        return std::ranges::find(list, text) != list.end();
    };
    return has(word) ||
           (word.ends_with('s') && has(std::string_view(word).substr(0, word.size() - 1)));
}

bool isPartOf(const std::string& text, Words parts) {
    return std::ranges::any_of(parts,
                               [&text](std::string_view part) { return text.contains(part); });
}

} // namespace

std::optional<SecretKind> kindOfValueNamed(std::string_view name) {
    const std::vector<std::string> words = wordsOf(name.substr(name.rfind('.') + 1));
    std::string joined;
    for (const std::string& word : words) {
        joined += word;
    }
    std::string plain = lowerCase(name);
    if (isPartOf(plain, kPasswordWords)) {
        return SecretKind::secret;
    }
    std::erase_if(plain, [](char character) { return !isAlphanumeric(character); });
    if (isPartOf(plain, kPasswordWords) || isPartOf(plain, secretParts)) {
        return SecretKind::secret;
    }
    if (isIn(accountNames, joined)) {
        return SecretKind::account;
    }
    if (isIn(deviceNames, joined)) {
        return SecretKind::device;
    }
    if (isIn(fileWords, joined)) {
        return SecretKind::file;
    }
    const auto holds = [&words](Words list) {
        return std::ranges::any_of(words, [list](const auto& word) { return isIn(list, word); });
    };
    if (holds(secretWords)) {
        return SecretKind::secret;
    }
    if (holds(folderWords)) {
        return SecretKind::file;
    }
    return holds(personWords) || holds(addressWords) ? std::optional(SecretKind::user)
                                                     : std::nullopt;
}

std::string lastWordOf(std::string_view name) {
    std::vector<std::string> words = wordsOf(name);
    return words.empty() ? std::string() : std::move(words.back());
}

} // namespace nimbra::mrctl

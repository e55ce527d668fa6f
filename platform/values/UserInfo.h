#pragma once

#include "platform/values/Date.h"
#include "platform/values/Identifier.h"
#include "platform/values/Text.h"

#include <cstdint>
#include <map>
#include <memory>
#include <variant>

namespace nimbra {

class Account;

/// One value of a user-info dictionary. An account is shared with whoever put it there.
using UserInfoValue =
    std::variant<std::monostate, bool, std::int64_t, double, Text, Date, std::shared_ptr<Account>>;

/// What travels with a row that opens a pane, or with a notification.
using UserInfo = std::map<UserInfoKey, UserInfoValue>;

/// The value of type `T` under `key`; a default `T` where there is none of that type.
template <class T>
T userInfoValue(const UserInfo& userInfo, const UserInfoKey& key) {
    const auto entry = userInfo.find(key);
    if (entry == userInfo.end()) {
        return T();
    }
    const T* held = std::get_if<T>(&entry->second);
    return held != nullptr ? *held : T();
}

} // namespace nimbra

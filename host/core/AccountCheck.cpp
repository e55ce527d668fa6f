#include "host/core/AccountCheck.h"

#include "device/DeviceError.h"
#include "device/DevicePlatform.h"
#include "device/store/DeviceAccountStore.h"
#include "host/core/PaneSession.h"

#include <algorithm>

namespace nimbra::host {

std::expected<void, Error> checkAccount(PaneSession& session, const std::string& account) {
    const auto known = session.device().accountStore().accountIdentifiers();
    if (!known) {
        return std::unexpected(known.error());
    }
    if (std::ranges::find(*known, AccountIdentifier(account)) != known->end()) {
        return {};
    }
    std::string list;
    for (const AccountIdentifier& identifier : *known) {
        list += (list.empty() ? "\"" : ", \"") + identifier.string() + '"';
    }
    return std::unexpected(
        device::deviceError("no account \"" + account + "\" (accounts: " + list + ')'));
}

} // namespace nimbra::host

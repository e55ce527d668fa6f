#include "host/core/AccountFlags.h"

#include "device/DevicePlatform.h"
#include "device/store/DeviceAccountStore.h"
#include "host/core/PaneSession.h"
#include "platform/accounts/Account.h"
#include "platform/accounts/Dataclass.h"

namespace nimbra::host {

std::optional<AccountFlags> AccountFlags::of(PaneSession& session, const PaneEntry& entry) {
    auto& store = session.device().accountStore();
    std::optional<AccountIdentifier> identifier;
    if (entry.account) {
        identifier.emplace(*entry.account);
    } else if (const auto known = store.accountIdentifiers(); known && !known->empty()) {
        identifier = known->front();
    }
    const auto account = identifier ? store.accountWithIdentifier(*identifier) : nullptr;
    if (!account) {
        return std::nullopt;
    }
    AccountFlags flags{.usesStratafile = account->vt_isUsingStratafile(), .dataclasses = {}};
    for (const Dataclass& dataclass :
         {kAccountDataclassTidewater, kAccountDataclassLarder, kAccountDataclassKeyValue,
          kAccountDataclassTSYDatabaseService, kAccountDataclassTSYDeviceService,
          kAccountDataclassTSYShareService}) {
        flags.dataclasses.push_back(account->isProvisionedForDataclass(dataclass));
        flags.dataclasses.push_back(account->isEnabledForDataclass(dataclass));
        flags.dataclasses.push_back(account->vt_useCellularForDataclass(dataclass));
    }
    return flags;
}

} // namespace nimbra::host

#include "host/core/trace/TracingAccount.h"

#include "host/core/trace/Trace.h"

#include <utility>

namespace nimbra::host {

nlohmann::ordered_json identifierOf(const std::shared_ptr<Account>& account) {
    return account ? nlohmann::ordered_json(account->identifier().string()) : nullptr;
}

TracingAccount::TracingAccount(std::shared_ptr<Account> account, Trace& trace)
    : _account(std::move(account)), _trace(trace) {}

std::shared_ptr<Account> TracingAccount::original(const std::shared_ptr<Account>& account) {
    const auto traced = std::dynamic_pointer_cast<TracingAccount>(account);
    return traced ? traced->_account : account;
}

const AccountIdentifier& TracingAccount::identifier() const {
    return _account->identifier();
}

bool TracingAccount::vt_isPrimaryAccount() const {
    return _account->vt_isPrimaryAccount();
}

bool TracingAccount::isProvisionedForDataclass(const Dataclass& dataclass) const {
    return _account->isProvisionedForDataclass(dataclass);
}

std::shared_ptr<Account> TracingAccount::vt_tessaryAccount() const {
    auto account = _account->vt_tessaryAccount();
    return account ? std::make_shared<TracingAccount>(std::move(account), _trace) : nullptr;
}

bool TracingAccount::isEnabledForDataclass(const Dataclass& dataclass) const {
    return _account->isEnabledForDataclass(dataclass);
}

void TracingAccount::setEnabledForDataclass(bool enabled, const Dataclass& dataclass) {
    traceFlag("setEnabled:forDataclass:", enabled, dataclass);
    _account->setEnabledForDataclass(enabled, dataclass);
}

bool TracingAccount::vt_isUsingStratafile() const {
    return _account->vt_isUsingStratafile();
}

void TracingAccount::vt_setUsesStratafile(bool usesStratafile) {
    _trace.write("account", {{"op", "vt_setUsesStratafile:"},
                             {"account", identifier().string()},
                             {"value", usesStratafile}});
    _account->vt_setUsesStratafile(usesStratafile);
}

bool TracingAccount::vt_useCellularForDataclass(const Dataclass& dataclass) const {
    return _account->vt_useCellularForDataclass(dataclass);
}

void TracingAccount::vt_setUseCellularForDataclass(bool useCellular, const Dataclass& dataclass) {
    traceFlag("vt_setUseCellular:forDataclass:", useCellular, dataclass);
    _account->vt_setUseCellularForDataclass(useCellular, dataclass);
}

void TracingAccount::reload() {
    _trace.write("account", {{"op", "reload"}, {"account", identifier().string()}});
    _account->reload();
}

void TracingAccount::traceFlag(const char* operation, bool value,
                               const Dataclass& dataclass) const {
    _trace.write("account", {{"op", operation},
                             {"account", identifier().string()},
                             {"dataclass", dataclass.string()},
                             {"value", value}});
}

} // namespace nimbra::host

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
    trace("setEnabled:forDataclass:", dataclass.string(), enabled);
    _account->setEnabledForDataclass(enabled, dataclass);
}

bool TracingAccount::vt_isUsingStratafile() const {
    return _account->vt_isUsingStratafile();
}

void TracingAccount::vt_setUsesStratafile(bool usesStratafile) {
    trace("vt_setUsesStratafile:", nullptr, usesStratafile);
    _account->vt_setUsesStratafile(usesStratafile);
}

bool TracingAccount::vt_useCellularForDataclass(const Dataclass& dataclass) const {
    return _account->vt_useCellularForDataclass(dataclass);
}

void TracingAccount::vt_setUseCellularForDataclass(bool useCellular, const Dataclass& dataclass) {
    trace("vt_setUseCellular:forDataclass:", dataclass.string(), useCellular);
    _account->vt_setUseCellularForDataclass(useCellular, dataclass);
}

void TracingAccount::reload() {
    trace("reload", nullptr, nullptr);
    _account->reload();
}

void TracingAccount::trace(const char* operation, const nlohmann::ordered_json& dataclass,
                           const nlohmann::ordered_json& value) const {
    _trace.write("account", {{"op", operation},
                             {"account", identifier().string()},
                             {"dataclass", dataclass},
                             {"value", value}});
}

} // namespace nimbra::host

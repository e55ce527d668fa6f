#include "host/core/trace/TracingAccountStore.h"

#include "host/core/trace/Trace.h"

#include <utility>

namespace nimbra::host {

namespace {

class TracingAccount final : public Account {
public:
    TracingAccount(std::shared_ptr<Account> account, Trace& trace)
        : _account(std::move(account)), _trace(trace) {}

    [[nodiscard]] const AccountIdentifier& identifier() const override {
        return _account->identifier();
    }
    [[nodiscard]] bool isEnabledForDataclass(const Dataclass& dataclass) const override {
        return _account->isEnabledForDataclass(dataclass);
    }
    void setEnabledForDataclass(bool enabled, const Dataclass& dataclass) override {
        _trace.write("account", {{"op", "setEnabled:forDataclass:"},
                                 {"account", identifier().string()},
                                 {"dataclass", dataclass.string()},
                                 {"value", enabled}});
        _account->setEnabledForDataclass(enabled, dataclass);
    }
    [[nodiscard]] bool vt_isUsingStratafile() const override {
        return _account->vt_isUsingStratafile();
    }

private:
    std::shared_ptr<Account> _account;
    Trace& _trace;
};

} // namespace

std::shared_ptr<Account>
TracingAccountStore::accountWithIdentifier(const AccountIdentifier& identifier) {
    _trace.write("fetchAccount", {{"account", identifier.string()}});
    return traced(_store.accountWithIdentifier(identifier));
}

std::shared_ptr<Account> TracingAccountStore::traced(std::shared_ptr<Account> account) const {
    return account ? std::make_shared<TracingAccount>(std::move(account), _trace) : nullptr;
}

} // namespace nimbra::host

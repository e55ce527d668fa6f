#pragma once

#include "platform/accounts/Account.h"

#include <memory>
#include <nlohmann/json.hpp>

namespace nimbra::host {

class Trace;

/// The identifier of `account` as traces have it; null for none.
[[nodiscard]] nlohmann::ordered_json identifierOf(const std::shared_ptr<Account>& account);

/// Stands for another account and traces what is changed on it.
class TracingAccount final : public Account {
public:
    /// `trace` is not owned and outlives the account.
    TracingAccount(std::shared_ptr<Account> account, Trace& trace);

    /// The account that `account` stands for; `account` itself where it is not traced.
    [[nodiscard]] static std::shared_ptr<Account> original(const std::shared_ptr<Account>& account);

    [[nodiscard]] const AccountIdentifier& identifier() const override;
    [[nodiscard]] bool vt_isPrimaryAccount() const override;
    [[nodiscard]] bool isProvisionedForDataclass(const Dataclass& dataclass) const override;
    /// Traced as well.
    [[nodiscard]] std::shared_ptr<Account> vt_tessaryAccount() const override;
    [[nodiscard]] bool isEnabledForDataclass(const Dataclass& dataclass) const override;
    void setEnabledForDataclass(bool enabled, const Dataclass& dataclass) override;
    [[nodiscard]] bool vt_isUsingStratafile() const override;
    void vt_setUsesStratafile(bool usesStratafile) override;
    [[nodiscard]] bool vt_useCellularForDataclass(const Dataclass& dataclass) const override;
    void vt_setUseCellularForDataclass(bool useCellular, const Dataclass& dataclass) override;
    void reload() override;

private:
    void trace(const char* operation, const nlohmann::ordered_json& dataclass,
               const nlohmann::ordered_json& value) const;

    std::shared_ptr<Account> _account;
    Trace& _trace;
};

} // namespace nimbra::host

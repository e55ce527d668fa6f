#include "host/core/trace/SaveTracing.h"

#include "host/core/trace/Trace.h"
#include "platform/accounts/Account.h"

namespace nimbra::host {

namespace {

nlohmann::ordered_json identifierOf(const std::shared_ptr<Account>& account) {
    return account ? nlohmann::ordered_json(account->identifier().string()) : nullptr;
}

} // namespace

void traceSaveStart(Trace& trace, const char* operation, const std::shared_ptr<Account>& account) {
    trace.write("save",
                {{"phase", "start"}, {"account", identifierOf(account)}, {"op", operation}});
}

void traceSaveEnd(Trace& trace, const char* operation, const std::shared_ptr<Account>& account,
                  const std::expected<void, Error>& saved) {
    nlohmann::ordered_json error;
    if (!saved) {
        error = {{"domain", saved.error().domain},
                 {"code", saved.error().code},
                 {"description", saved.error().description}};
    }
    trace.write("save", {{"phase", "end"},
                         {"account", identifierOf(account)},
                         {"op", operation},
                         {"success", saved.has_value()},
                         {"error", std::move(error)}});
}

} // namespace nimbra::host

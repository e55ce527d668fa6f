#include "host/core/trace/SaveTracing.h"

#include "host/core/trace/Trace.h"
#include "platform/accounts/Account.h"

namespace nimbra::host {

void traceSaveStart(Trace& trace, const char* operation, const Account& account) {
    trace.write(
        "save",
        {{"phase", "start"}, {"account", account.identifier().string()}, {"op", operation}});
}

void traceSaveEnd(Trace& trace, const char* operation, const Account& account,
                  const std::expected<void, Error>& saved) {
    nlohmann::ordered_json error;
    if (!saved) {
        error = {{"domain", saved.error().domain},
                 {"code", saved.error().code},
                 {"description", saved.error().description}};
    }
    trace.write("save", {{"phase", "end"},
                         {"account", account.identifier().string()},
                         {"op", operation},
                         {"success", saved.has_value()},
                         {"error", std::move(error)}});
}

} // namespace nimbra::host

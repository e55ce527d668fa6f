#include "host/core/trace/SaveTracing.h"

#include "host/core/trace/Trace.h"
#include "host/core/trace/TracingAccount.h"

namespace nimbra::host {

void traceSaveStart(Trace& trace, const char* operation, const std::shared_ptr<Account>& account) {
    trace.write("save",
                {{"phase", "start"}, {"account", identifierOf(account)}, {"op", operation}});
}

void traceSaveEnd(Trace& trace, const char* operation, const std::shared_ptr<Account>& account,
                  const std::expected<void, Error>& saved) {
    trace.write("save", {{"phase", "end"},
                         {"account", identifierOf(account)},
                         {"op", operation},
                         {"success", saved.has_value()},
                         {"error", saved ? nullptr : jsonOf(saved.error())}});
}

} // namespace nimbra::host

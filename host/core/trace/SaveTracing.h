#pragma once

#include "platform/values/Error.h"

#include <expected>
#include <memory>

namespace nimbra {
class Account;
}

namespace nimbra::host {

class Trace;

/// Traces that a save of `account`, which may be null, with `operation` is asked for.
void traceSaveStart(Trace& trace, const char* operation, const std::shared_ptr<Account>& account);
/// Traces that it is over.
void traceSaveEnd(Trace& trace, const char* operation, const std::shared_ptr<Account>& account,
                  const std::expected<void, Error>& saved);

} // namespace nimbra::host

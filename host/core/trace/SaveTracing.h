#pragma once

#include "platform/values/Error.h"

#include <expected>

namespace nimbra {
class Account;
}

namespace nimbra::host {

class Trace;

/// Traces that a save of `account` with `operation` is asked for.
void traceSaveStart(Trace& trace, const char* operation, const Account& account);
/// Traces that it is over.
void traceSaveEnd(Trace& trace, const char* operation, const Account& account,
                  const std::expected<void, Error>& saved);

} // namespace nimbra::host

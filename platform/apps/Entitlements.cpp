#include "platform/apps/Entitlements.h"

namespace nimbra {

bool EntitlementValue::isTrueNumber() const {
    if (const bool* boolean = std::get_if<bool>(&value)) {
        return *boolean;
    }
    if (const auto* integer = std::get_if<std::int64_t>(&value)) {
        return *integer != 0;
    }
    const double* number = std::get_if<double>(&value);
    return number != nullptr && *number != 0;
}

// NOLINTNEXTLINE(misc-no-recursion): arrays and dictionaries hold values in their turn
bool operator==(const EntitlementValue& left, const EntitlementValue& right) {
    return left.value == right.value;
}

} // namespace nimbra

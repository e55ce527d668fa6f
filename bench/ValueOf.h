#pragma once

#include "platform/values/Error.h"

#include <expected>
#include <stdexcept>
#include <type_traits>
#include <utility>

namespace nimbra::bench {

/// What `result` holds; a benchmark without what it is to measure ends with the error.
template <class T>
T valueOf(std::expected<T, Error> result) {
    if (!result) {
        throw std::runtime_error(result.error().line());
    }
    if constexpr (!std::is_void_v<T>) {
        return std::move(*result);
    }
}

} // namespace nimbra::bench

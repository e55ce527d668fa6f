#pragma once

#include <cstddef>
#include <pthread.h>
#include <string>

namespace nimbra::device {

/// Lets debuggers call the calling thread `name`, or as much of that as they have room for.
inline void nameCurrentThread(const std::string& name) {
    constexpr std::size_t longest = 15;
    ::pthread_setname_np(::pthread_self(), name.substr(0, longest).c_str());
}

} // namespace nimbra::device

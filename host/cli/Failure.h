#pragma once

#include "host/core/ExitStatus.h"

#include <string>

namespace nimbra::cli {

using host::exitBadInput;
using host::exitDone;
using host::exitRefused;

/// Why a command was not done, in one line to be read behind the program's name.
struct Failure {
    int exitStatus;
    std::string message;
};

} // namespace nimbra::cli

#include "host/core/scenario/TemporaryDirectory.h"

#include "device/DeviceError.h"

#include <cerrno>
#include <cstdlib>
#include <string>
#include <system_error>

namespace nimbra::host {

std::expected<TemporaryDirectory, Error> TemporaryDirectory::make() {
    std::error_code problem;
    const std::filesystem::path parent = std::filesystem::temp_directory_path(problem);
    if (problem) {
        return std::unexpected(
            device::deviceError("no directory for temporary files: " + problem.message()));
    }
    std::string pattern = parent / "nimbra-XXXXXX";
    if (::mkdtemp(pattern.data()) == nullptr) {
        return std::unexpected(
            device::fileError(parent, "a temporary directory cannot be made", errno));
    }
    return TemporaryDirectory(pattern);
}

TemporaryDirectory::~TemporaryDirectory() {
    if (!_path.empty()) {
        remove();
    }
}

void TemporaryDirectory::remove() const {
    // Whoever still works in the directory may put a file into it between the listing and the
    // removal; without its directories nothing new can be made, so few rounds are enough.
    constexpr int rounds = 8;
    std::error_code problem;
    for (int round = 0; round < rounds; ++round) {
        std::filesystem::remove_all(_path, problem);
        if (!problem) {
            return;
        }
    }
}

} // namespace nimbra::host

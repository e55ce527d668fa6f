#include "host/core/BundleSearch.h"

#include <array>
#include <system_error>

namespace nimbra::host {

namespace {

constexpr const char* bundleName = "NimbraDriveSettings.bundle";

bool isThere(const std::filesystem::path& path) {
    std::error_code ignored;
    return std::filesystem::exists(path, ignored);
}

} // namespace

std::filesystem::path executableDirectory() {
    std::error_code ignored;
    return std::filesystem::read_symlink("/proc/self/exe", ignored).parent_path();
}

std::filesystem::path findPaneBundle(const std::filesystem::path& root) {
    const std::filesystem::path programs = executableDirectory();
    const std::array candidates{
        root / "System/Library/PreferenceBundles/AccountSettings" / bundleName,
        programs / bundleName,
        (programs / ".." / NIMBRA_LIBDIR / "nimbra" / bundleName).lexically_normal()};
    for (const auto& candidate : candidates) {
        if (isThere(candidate)) {
            return candidate;
        }
    }
    return candidates.back();
}

} // namespace nimbra::host

#include "host/core/BundleSearch.h"

#include <system_error>

namespace nimbra::host {

namespace {

constexpr const char* paneBundle = "NimbraDriveSettings.bundle";

bool isThere(const std::filesystem::path& path) {
    std::error_code ignored;
    return std::filesystem::exists(path, ignored);
}

/// The bundle called `name` that came with this program, built or installed.
std::filesystem::path suppliedBundle(const char* name) {
    const std::filesystem::path programs = executableDirectory();
    auto built = programs / name;
    return isThere(built) ? built
                          : (programs / ".." / NIMBRA_LIBDIR / "nimbra" / name).lexically_normal();
}

} // namespace

std::filesystem::path executableDirectory() {
    std::error_code ignored;
    return std::filesystem::read_symlink("/proc/self/exe", ignored).parent_path();
}

std::filesystem::path findPaneBundle(const std::filesystem::path& root) {
    const auto onDevice = root / "System/Library/PreferenceBundles/AccountSettings" / paneBundle;
    return isThere(onDevice) ? onDevice : suppliedBundle(paneBundle);
}

device::DeviceParts findDeviceParts() {
    // Built or installed, programs stand beside each other.
    return {.tool = executableDirectory() / "mrctl",
            .databaseBundle = suppliedBundle("TessarySettings.bundle")};
}

} // namespace nimbra::host

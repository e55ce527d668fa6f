#pragma once

#include "platform/values/Error.h"
#include "platform/values/Identifier.h"

#include <expected>
#include <filesystem>
#include <optional>
#include <string>

namespace nimbra::device {

/// What a bundle's file `manifest.json` says of it.
struct Manifest {
    BundleIdentifier identifier;
    /// The file name of the shared object beside the manifest.
    std::string executable;
    /// The class of the shared object that a host creates first; absent where it creates none.
    std::optional<std::string> principalClass;
    /// The language to which texts fall back in the end.
    std::string developmentLanguage;

    /// Reads the manifest of the bundle in the folder `bundle`. An error names the file, the place
    /// in it and what was expected there.
    [[nodiscard]] static std::expected<Manifest, Error> read(const std::filesystem::path& bundle);
};

} // namespace nimbra::device

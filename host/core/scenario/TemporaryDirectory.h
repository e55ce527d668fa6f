#pragma once

#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <utility>

namespace nimbra::host {

/// A directory that goes with this object, with all that stands in it.
class TemporaryDirectory {
public:
    /// Makes an empty directory where temporary files belong.
    [[nodiscard]] static std::expected<TemporaryDirectory, Error> make();

    TemporaryDirectory(TemporaryDirectory&& other) noexcept
        : _path(std::exchange(other._path, {})) {}
    TemporaryDirectory(const TemporaryDirectory&) = delete;
    TemporaryDirectory& operator=(const TemporaryDirectory&) = delete;
    TemporaryDirectory& operator=(TemporaryDirectory&&) = delete;
    ~TemporaryDirectory();

    [[nodiscard]] const std::filesystem::path& path() const { return _path; }

    /// Takes everything away at once, although it may be in use: for a program that ends. Any
    /// thread.
    void remove() const;

private:
    explicit TemporaryDirectory(std::filesystem::path path) : _path(std::move(path)) {}

    std::filesystem::path _path;
};

} // namespace nimbra::host

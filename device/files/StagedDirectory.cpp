#include "device/files/StagedDirectory.h"

#include "device/DeviceError.h"
#include "device/files/Files.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <iterator>
#include <ranges>
#include <string>
#include <sys/stat.h>
#include <system_error>
#include <utility>

namespace nimbra::device {

namespace {

constexpr mode_t readableByEverybody = 0755;

/// `path` as an absolute one that ends in a name, without a slash or a "." behind it. A ".." stays,
/// as it may stand behind a link. There is none for an empty path, nor in a working directory that
/// has been removed.
std::expected<std::filesystem::path, Error> absoluteName(const std::filesystem::path& path) {
    if (path.empty()) {
        return std::unexpected(deviceError("the name of a directory is empty"));
    }
    std::error_code failure;
    auto name = std::filesystem::absolute(path, failure);
    if (failure) {
        return std::unexpected(fileError(path, "cannot be made", failure.value()));
    }
    while (name.has_relative_path() && (!name.has_filename() || name.filename() == ".")) {
        name = name.parent_path();
    }
    return name;
}

/// Flushes the entries of `root` and of all directories below it.
std::expected<void, Error> synchronizeTree(const std::filesystem::path& root) {
    std::vector<std::filesystem::path> directories{root};
    while (!directories.empty()) {
        const std::filesystem::path directory = std::move(directories.back());
        directories.pop_back();
        const auto entries = entriesOfDirectory(directory);
        if (!entries) {
            return std::unexpected(entries.error());
        }
        std::ranges::copy_if(*entries, std::back_inserter(directories), [](const auto& entry) {
            std::error_code failure;
            return std::filesystem::is_directory(entry, failure);
        });
        if (auto synchronized = synchronizeDirectory(directory); !synchronized) {
            return synchronized;
        }
    }
    return {};
}

std::expected<void, Error> moveTo(const std::filesystem::path& from,
                                  const std::filesystem::path& target) {
    std::error_code failure;
    std::filesystem::rename(from, target, failure);
    if (failure) {
        return std::unexpected(fileError(target, "cannot be made", failure.value()));
    }
    return {};
}

} // namespace

std::expected<StagedDirectory, Error> StagedDirectory::start(const std::filesystem::path& target) {
    const auto absolute = absoluteName(target);
    if (!absolute) {
        return std::unexpected(absolute.error());
    }
    StagedDirectory staged;
    staged._target = *absolute;
    std::error_code failure;
    staged._targetExists = std::filesystem::exists(staged._target, failure);
    if (staged._targetExists) {
        const bool isEmpty = std::filesystem::is_directory(staged._target, failure) &&
                             std::filesystem::is_empty(staged._target, failure);
        if (!failure && !isEmpty) {
            return std::unexpected(
                deviceError(target.string() + ": exists and is not an empty directory"));
        }
    }
    if (failure) {
        return std::unexpected(fileError(target, "cannot be made", failure.value()));
    }
    if (auto made = staged.makeParents(); !made) {
        return std::unexpected(made.error());
    }
    // An empty directory keeps its identity, as somebody may stand in it or have mounted it: what
    // is built inside moves up in the end.
    const auto place = staged._targetExists ? staged._target : staged._target.parent_path();
    std::string name = (place / ".nimbra-device.XXXXXX").string();
    if (::mkdtemp(name.data()) == nullptr) {
        return std::unexpected(fileError(target, "cannot be made", errno));
    }
    staged._path = name;
    if (::chmod(name.c_str(), readableByEverybody) != 0) {
        return std::unexpected(fileError(target, "cannot be made", errno));
    }
    return staged;
}

StagedDirectory::StagedDirectory(StagedDirectory&& other) noexcept
    : _target(std::move(other._target)), _path(std::exchange(other._path, {})),
      _targetExists(other._targetExists), _made(std::exchange(other._made, {})) {}

StagedDirectory::~StagedDirectory() {
    std::error_code ignored; // nobody is left to be told
    if (!_path.empty()) {
        std::filesystem::remove_all(_path, ignored);
    }
    for (const std::filesystem::path& directory : _made | std::views::reverse) {
        std::filesystem::remove(directory, ignored);
    }
}

std::expected<void, Error> StagedDirectory::makeParents() {
    std::vector<std::filesystem::path> missing;
    std::error_code failure;
    for (auto parent = _target.parent_path();
         parent.has_relative_path() && !std::filesystem::exists(parent, failure);
         parent = parent.parent_path()) {
        missing.push_back(parent);
    }
    for (auto parent = missing.rbegin(); parent != missing.rend() && !failure; ++parent) {
        if (std::filesystem::create_directory(*parent, failure)) {
            _made.push_back(*parent);
        }
    }
    if (failure) {
        return std::unexpected(fileError(_target, "cannot be made", failure.value()));
    }
    return {};
}

std::expected<void, Error> StagedDirectory::moveEntriesIn() {
    const auto entries = entriesOfDirectory(_path);
    if (!entries) {
        return std::unexpected(entries.error());
    }
    for (const std::filesystem::path& entry : *entries) {
        if (auto moved = moveTo(entry, _target / entry.filename()); !moved) {
            return moved;
        }
    }
    std::error_code failure;
    std::filesystem::remove(_path, failure);
    if (failure) {
        return std::unexpected(fileError(_path, "cannot be removed", failure.value()));
    }
    return {};
}

std::expected<void, Error> StagedDirectory::putInPlace() {
    if (auto synchronized = synchronizeTree(_path); !synchronized) {
        return synchronized;
    }
    const auto moved = _targetExists ? moveEntriesIn() : moveTo(_path, _target);
    if (!moved) {
        return moved;
    }
    _path.clear();
    _made.clear();
    return synchronizeDirectory(_targetExists ? _target : _target.parent_path());
}

} // namespace nimbra::device

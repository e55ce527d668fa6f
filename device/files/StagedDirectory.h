#pragma once

#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <vector>

namespace nimbra::device {

/// A directory that is built out of sight and then put in its place as a whole. What has not been
/// put in place is removed again, with the directories that were made for it.
class StagedDirectory {
public:
    /// Starts the directory that is to stand at `target`, which does not exist or is empty;
    /// directories above it are made.
    [[nodiscard]] static std::expected<StagedDirectory, Error>
    start(const std::filesystem::path& target);

    StagedDirectory(StagedDirectory&& other) noexcept;
    StagedDirectory& operator=(StagedDirectory&&) = delete;
    ~StagedDirectory();

    /// Where to build.
    [[nodiscard]] const std::filesystem::path& path() const { return _path; }

    /// Flushes what was built and puts it in its place: by one renaming, or by one for each entry
    /// where the target exists, of which some may stand there after an error.
    [[nodiscard]] std::expected<void, Error> putInPlace();

private:
    StagedDirectory() = default;
    [[nodiscard]] std::expected<void, Error> makeParents();
    [[nodiscard]] std::expected<void, Error> moveEntriesIn();

    std::filesystem::path _target;
    std::filesystem::path _path;
    bool _targetExists = false;
    /// The directories that were made above the target, from the outermost in.
    std::vector<std::filesystem::path> _made;
};

} // namespace nimbra::device

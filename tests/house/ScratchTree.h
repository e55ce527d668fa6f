#pragma once

#include <filesystem>
#include <string>

namespace nimbra::test {

/// A folder of its own for one test, gone with the object.
class ScratchTree {
public:
    ScratchTree();
    ScratchTree(const ScratchTree&) = delete;
    ScratchTree& operator=(const ScratchTree&) = delete;
    ~ScratchTree();

    [[nodiscard]] const std::filesystem::path& root() const { return _root; }

    /// Writes `content` to the file `path` below the root; the folders above it are made.
    void write(const std::filesystem::path& path, const std::string& content) const;
    /// The same for a program.
    void writeProgram(const std::filesystem::path& path, const std::string& content) const;

private:
    std::filesystem::path _root;
};

} // namespace nimbra::test

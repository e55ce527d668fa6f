#pragma once

#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <string>
#include <string_view>

namespace nimbra::test {

inline void writeTestFile(const std::filesystem::path& path, std::string_view content) {
    std::filesystem::create_directories(path.parent_path());
    std::ofstream(path, std::ios::binary) << content;
}

inline std::string contentOf(const std::filesystem::path& path) {
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

/// Everything below `directory`: the paths, and what the files hold.
inline std::map<std::string, std::string> treeOf(const std::filesystem::path& directory) {
    std::map<std::string, std::string> tree;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(directory)) {
        tree[entry.path().lexically_relative(directory).string()] =
            entry.is_regular_file() ? contentOf(entry.path()) : "directory";
    }
    return tree;
}

} // namespace nimbra::test

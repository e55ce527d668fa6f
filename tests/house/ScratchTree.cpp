#include "tests/house/ScratchTree.h"

#include <cerrno>
#include <cstdlib>
#include <fstream>
#include <system_error>

namespace nimbra::test {

namespace fs = std::filesystem;

ScratchTree::ScratchTree() {
    std::string form = (fs::temp_directory_path() / "nimbra house XXXXXX").string();
    if (::mkdtemp(form.data()) == nullptr) {
        throw std::system_error(errno, std::generic_category(), form);
    }
    _root = form;
}

ScratchTree::~ScratchTree() {
    std::error_code ignored;
    fs::remove_all(_root, ignored);
}

void ScratchTree::write(const fs::path& path, const std::string& content) const {
    const fs::path place = _root / path;
    fs::create_directories(place.parent_path());
    std::ofstream file(place);
    file.exceptions(std::ios::failbit | std::ios::badbit);
    file << content;
    file.close();
}

void ScratchTree::writeProgram(const fs::path& path, const std::string& content) const {
    write(path, content);
    fs::permissions(_root / path, fs::perms::owner_all);
}

} // namespace nimbra::test

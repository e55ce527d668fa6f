#include "device/documents/ProgressFiles.h"

#include "device/documents/ProgressFile.h"
#include "device/files/Files.h"
#include "device/files/PlainFile.h"

#include <cerrno>
#include <utility>

namespace nimbra::device {

std::expected<std::vector<ProgressFileContent>, Error> readProgressFiles(const DevicePaths& paths) {
    const auto directory = paths.resolve(kProgressDirectory);
    if (!directory) {
        return std::unexpected(directory.error());
    }
    const auto files = entriesOfDirectory(*directory);
    if (!files && files.error().code == ENOENT) {
        return std::vector<ProgressFileContent>();
    }
    if (!files) {
        return std::unexpected(files.error());
    }
    return readListedProgressFiles(*files);
}

std::vector<ProgressFileContent>
readListedProgressFiles(const std::vector<std::filesystem::path>& files) {
    std::vector<ProgressFileContent> contents;
    for (const std::filesystem::path& path : files) {
        if (!isProgressFileName(path.filename().string())) {
            continue;
        }
        const auto file = PlainFile::read(path, kMostBytesOfProgressFile, path);
        if (!file && file.error().code == ENOENT) {
            continue;
        }
        contents.push_back({.name = path.stem(),
                            .values = file ? parseProgressFile(file->content, path)
                                           : std::unexpected(file.error())});
    }
    return contents;
}

} // namespace nimbra::device

#include "device/documents/DeviceFileManager.h"

#include "device/files/FileOperations.h"

#include <cerrno>
#include <sys/stat.h>
#include <utility>

namespace nimbra::device {

DeviceFileManager::DeviceFileManager(DevicePaths paths, DocumentsFile documents)
    : _paths(std::move(paths)), _documents(std::move(documents)) {}

Text DeviceFileManager::SystemRootDirectory() const {
    return "/";
}

Text DeviceFileManager::tidewaterIdentityToken() {
    const auto description = _documents.read();
    return description && description->identity ? Text(*description->identity) : Text();
}

std::expected<void, Error> DeviceFileManager::removeItemAtPath(const std::string& path) {
    if (auto planned = _removeOutcomes.take()) {
        return std::unexpected(std::move(*planned));
    }
    auto removed = removeItem(_paths, path);
    if (!removed && removed.error().code == ENOENT) {
        removed.error().domain = PlatformErrorDomain;
        removed.error().code = FileNoSuchFileError;
    }
    return removed;
}

std::expected<void, Error>
DeviceFileManager::createDirectoryAtPathWithIntermediateDirectoriesAttributes(
    const std::string& path, bool createsIntermediates, const FileAttributes& attributes) {
    if (auto planned = _createOutcomes.take()) {
        return std::unexpected(std::move(*planned));
    }
    return createFolder(
        _paths, path,
        {.makesParents = createsIntermediates, .permissions = attributes.posixPermissions});
}

bool DeviceFileManager::isResourceReachable(const FileURL& url) {
    struct stat status{};
    const auto place = placeOf(_paths, url.path());
    return place && ::lstat(place->c_str(), &status) == 0;
}

std::optional<std::string> DeviceFileManager::fileSystemRepresentation(const FileURL& url) {
    const auto place = placeOf(_paths, url.path());
    return place ? std::optional(*place) : std::nullopt;
}

void DeviceFileManager::planRemoveOutcomes(std::vector<std::optional<Error>> outcomes) {
    _removeOutcomes.plan(std::move(outcomes));
}

void DeviceFileManager::planCreateOutcomes(std::vector<std::optional<Error>> outcomes) {
    _createOutcomes.plan(std::move(outcomes));
}

} // namespace nimbra::device

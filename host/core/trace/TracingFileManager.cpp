#include "host/core/trace/TracingFileManager.h"

#include "host/core/trace/Trace.h"

#include <sstream>

namespace nimbra::host {

namespace {

nlohmann::ordered_json octal(const std::optional<mode_t>& mode) {
    if (!mode) {
        return nullptr;
    }
    std::ostringstream text;
    text << '0' << std::oct << *mode;
    return text.str();
}

void write(Trace& trace, Trace::Keys keys, const std::expected<void, Error>& done) {
    if (!done) {
        keys.emplace_back("error", jsonOf(done.error()));
    }
    trace.write("file", keys);
}

} // namespace

Text TracingFileManager::SystemRootDirectory() const {
    return _files.SystemRootDirectory();
}

Text TracingFileManager::tidewaterIdentityToken() {
    return _files.tidewaterIdentityToken();
}

std::expected<void, Error> TracingFileManager::removeItemAtPath(const std::string& path) {
    auto removed = _files.removeItemAtPath(path);
    write(_trace, {{"op", "removeItem"}, {"path", path}}, removed);
    return removed;
}

std::expected<void, Error>
TracingFileManager::createDirectoryAtPathWithIntermediateDirectoriesAttributes(
    const std::string& path, bool createsIntermediates, const FileAttributes& attributes) {
    auto created = _files.createDirectoryAtPathWithIntermediateDirectoriesAttributes(
        path, createsIntermediates, attributes);
    write(_trace,
          {{"op", "createDirectory"},
           {"path", path},
           {"intermediates", createsIntermediates},
           {"mode", octal(attributes.posixPermissions)}},
          created);
    return created;
}

bool TracingFileManager::isResourceReachable(const FileURL& url) {
    return _files.isResourceReachable(url);
}

std::optional<std::string> TracingFileManager::fileSystemRepresentation(const FileURL& url) {
    return _files.fileSystemRepresentation(url);
}

} // namespace nimbra::host

#pragma once

#include <ostream>
#include <string>
#include <utility>

namespace nimbra {

/// Names a file by its absolute path on the device, as the device itself calls it.
class FileURL {
public:
    explicit FileURL(std::string path) : _path(std::move(path)) {}

    [[nodiscard]] const std::string& path() const { return _path; }

    friend bool operator==(const FileURL&, const FileURL&) = default;
    friend std::ostream& operator<<(std::ostream& out, const FileURL& url) {
        return out << url._path;
    }

private:
    std::string _path;
};

} // namespace nimbra

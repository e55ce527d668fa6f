#include "tools/mrctl/ArchiveFile.h"

#include "device/DeviceError.h"
#include "tools/mrctl/TemporaryFile.h"

#include <archive.h>
#include <archive_entry.h>
#include <cerrno>
#include <ctime>
#include <memory>
#include <optional>
#include <utility>

namespace nimbra::mrctl {

namespace {

struct ArchiveFree {
    void operator()(archive* written) const { ::archive_write_free(written); }
};
struct EntryFree {
    void operator()(archive_entry* entry) const { ::archive_entry_free(entry); }
};

/// An archive while it is written to an open file.
class Writing {
public:
    Writing(std::filesystem::path path, int descriptor)
        : _path(std::move(path)), _archive(::archive_write_new()) {
        // This form keeps names as they are, of any length and whatever the locale.
        check(::archive_write_set_format_gnutar(get()));
        check(::archive_write_add_filter_gzip(get()));
        check(::archive_write_set_bytes_in_last_block(get(), 1));
        check(::archive_write_open_fd(get(), descriptor));
    }

    void add(const std::string& name, mode_t type, const std::string& content) {
        const std::unique_ptr<archive_entry, EntryFree> entry(::archive_entry_new());
        const bool isDirectory = type == AE_IFDIR;
        ::archive_entry_set_pathname(entry.get(), name.c_str());
        ::archive_entry_set_filetype(entry.get(), type);
        ::archive_entry_set_perm(entry.get(), isDirectory ? 0755 : 0644);
        ::archive_entry_set_uname(entry.get(), "nimbra");
        ::archive_entry_set_gname(entry.get(), "nimbra");
        ::archive_entry_set_mtime(entry.get(), std::time(nullptr), 0);
        ::archive_entry_set_size(entry.get(), static_cast<la_int64_t>(content.size()));
        check(::archive_write_header(get(), entry.get()));
        if (!_error && ::archive_write_data(get(), content.data(), content.size()) !=
                           static_cast<la_ssize_t>(content.size())) {
            check(ARCHIVE_FATAL);
        }
    }

    /// Writes what is still to be written; the first error of all.
    [[nodiscard]] std::expected<void, Error> finish() {
        check(::archive_write_close(get()));
        return _error ? std::unexpected(*_error) : std::expected<void, Error>();
    }

private:
    [[nodiscard]] archive* get() { return _archive.get(); }

    void check(int result) {
        if (result == ARCHIVE_OK || _error) {
            return;
        }
        const int number = ::archive_errno(get());
        _error = device::fileError(_path, "cannot be written", number > 0 ? number : EIO);
    }

    std::filesystem::path _path;
    std::unique_ptr<archive, ArchiveFree> _archive;
    std::optional<Error> _error;
};

} // namespace

std::expected<void, Error> ArchiveFile::write(const std::filesystem::path& path,
                                              const Report& report) {
    const std::string name = path.filename();
    if (name.empty() || name == "." || name == "..") {
        return std::unexpected(device::fileError(path, "cannot be written", EISDIR));
    }
    auto file = TemporaryFile::make(path, temporaryPrefix);
    if (!file) {
        return std::unexpected(file.error());
    }
    Writing writing(path, file->descriptor());
    writing.add(report.folder + '/', AE_IFDIR, {});
    for (const auto& [fileName, what, content] : report.files) {
        writing.add(report.folder + '/' + fileName, AE_IFREG, content);
    }
    auto written = writing.finish();
    return written ? file->putInPlace() : written;
}

std::string ArchiveFile::libraryVersion() {
    return ::archive_version_string();
}

} // namespace nimbra::mrctl

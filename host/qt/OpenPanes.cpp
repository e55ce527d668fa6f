#include "host/qt/OpenPanes.h"

#include "device/DeviceError.h"

#include <array>
#include <cerrno>
#include <cstddef>
#include <dirent.h>
#include <fcntl.h>
#include <functional>
#include <iomanip>
#include <memory>
#include <random>
#include <sstream>
#include <sys/file.h>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>
#include <utility>
#include <vector>

namespace nimbra::window {

namespace {

using device::Descriptor;
using device::fileError;

constexpr std::string_view namePrefix = "pane-";
constexpr mode_t folderMode = 0700;
constexpr mode_t fileMode = 0600;
/// A path and a title come nowhere near it.
constexpr std::size_t mostBytes = 65536;
/// Stands behind each of the two values in a file: no path has it within, and a file without the
/// second one is not complete.
constexpr char valueEnd = '\0';

/// The one name of the device in `root`, however it is written.
std::string deviceName(const std::filesystem::path& root) {
    std::error_code failure;
    auto name = std::filesystem::absolute(root, failure);
    if (auto canonical = std::filesystem::weakly_canonical(name, failure); !failure) {
        name = std::move(canonical);
    }
    return name.string();
}

std::string newName() {
    std::random_device source;
    std::ostringstream name;
    name << namePrefix << std::hex << std::setfill('0') << std::setw(8) << source() << std::setw(8)
         << source();
    return name.str();
}

/// Negative, with errno, where there is none.
Descriptor openFolder(const std::filesystem::path& folder) {
    return Descriptor(
        ::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC));
}

std::expected<Descriptor, Error> provideFolder(const std::filesystem::path& folder) {
    std::error_code failure;
    std::filesystem::create_directories(folder.parent_path(), failure);
    if (failure) {
        return std::unexpected(fileError(folder, "cannot be made", failure.value()));
    }
    if (::mkdir(folder.c_str(), folderMode) != 0 && errno != EEXIST) {
        return std::unexpected(fileError(folder, "cannot be made", errno));
    }
    Descriptor opened = openFolder(folder);
    if (!opened.isOpen()) {
        return std::unexpected(fileError(folder, "cannot be opened", errno));
    }
    return opened;
}

/// The names of the hosts' files in `folder`, or the errno.
std::expected<std::vector<std::string>, int> namesIn(const Descriptor& folder) {
    struct Closing {
        void operator()(DIR* entries) const { ::closedir(entries); }
    };
    // It takes over its descriptor.
    const int number = ::openat(folder.number(), ".", O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    const std::unique_ptr<DIR, Closing> entries(number < 0 ? nullptr : ::fdopendir(number));
    if (entries == nullptr) {
        return std::unexpected(errno);
    }
    std::vector<std::string> names;
    while (true) {
        errno = 0;
        const dirent* const entry = ::readdir(entries.get());
        if (entry == nullptr) {
            break;
        }
        if (std::string_view(entry->d_name).starts_with(namePrefix)) {
            names.emplace_back(entry->d_name);
        }
    }
    if (errno != 0) {
        return std::unexpected(errno);
    }
    return names;
}

/// What a file of a host says.
struct Content {
    std::string device;
    std::string title;
};

/// What stands in `file`: nothing where its host did not come to the end of writing it. An error
/// is the errno.
std::expected<std::optional<Content>, int> contentOf(const Descriptor& file) {
    std::string bytes;
    std::array<char, 4096> buffer; // NOLINT(cppcoreguidelines-pro-type-member-init): filled below
    while (bytes.size() < mostBytes) {
        const ssize_t count = ::read(file.number(), buffer.data(), buffer.size());
        if (count == 0) {
            break;
        }
        if (count > 0) {
            bytes.append(buffer.data(), static_cast<std::size_t>(count));
        } else if (errno != EINTR) {
            return std::unexpected(errno);
        }
    }
    const std::size_t first = bytes.find(valueEnd);
    if (first == std::string::npos || first + 1 == bytes.size() || bytes.back() != valueEnd) {
        return std::nullopt;
    }
    return Content{.device = bytes.substr(0, first),
                   .title = bytes.substr(first + 1, bytes.size() - first - 2)};
}

/// The errno where it does not succeed.
std::expected<void, int> writeContent(const Descriptor& file, std::string_view bytes) {
    while (!bytes.empty()) {
        const ssize_t count = ::write(file.number(), bytes.data(), bytes.size());
        if (count >= 0) {
            bytes.remove_prefix(static_cast<std::size_t>(count));
        } else if (errno != EINTR) {
            return std::unexpected(errno);
        }
    }
    return {};
}

/// Whether the lock of `file` is held from now on and the file still stands in its folder; `status`
/// is what it is then. An error is the errno.
std::expected<bool, int> takeLock(const Descriptor& file, struct stat& status) {
    if (::flock(file.number(), LOCK_EX | LOCK_NB) != 0) {
        return errno == EWOULDBLOCK ? std::expected<bool, int>(false) : std::unexpected(errno);
    }
    if (::fstat(file.number(), &status) != 0) {
        return std::unexpected(errno);
    }
    return status.st_nlink > 0;
}

/// A file whose host is no more.
struct Left {
    std::string title;
    timespec written;
};

/// Looks at the file `name` in `folder`: removes it where a host of `device` left it when it died,
/// and says what it had open then. `note` is told the errno of what does not succeed.
std::optional<Left> takeFile(const Descriptor& folder, const std::string& name,
                             const std::string& device,
                             const std::function<void(const std::string&, int)>& note) {
    struct stat status{};
    // To open something else than a file may already have an effect, or wait.
    if (::fstatat(folder.number(), name.c_str(), &status, AT_SYMLINK_NOFOLLOW) != 0 ||
        !S_ISREG(status.st_mode)) {
        return std::nullopt;
    }
    const Descriptor file(::openat(folder.number(), name.c_str(),
                                   O_RDONLY | O_NONBLOCK | O_NOFOLLOW | O_NOCTTY | O_CLOEXEC));
    if (!file.isOpen()) {
        // Another host may have closed its pane since.
        if (errno != ENOENT) {
            note("cannot be opened", errno);
        }
        return std::nullopt;
    }
    const auto taken = takeLock(file, status);
    if (!taken) {
        note("cannot be locked", taken.error());
    }
    // Between the two calls a pipe may have taken the place.
    if (!taken || !*taken || !S_ISREG(status.st_mode)) {
        return std::nullopt;
    }
    const auto content = contentOf(file);
    if (!content) {
        note("cannot be read", content.error());
        return std::nullopt;
    }
    if (*content && (*content)->device != device) {
        return std::nullopt;
    }
    if (::unlinkat(folder.number(), name.c_str(), 0) != 0 && errno != ENOENT) {
        note("cannot be removed", errno);
    }
    // Without its end it is from a host that died before the pane opened, or closed it where no
    // file can be removed.
    return *content ? std::optional<Left>({.title = (*content)->title, .written = status.st_mtim})
                    : std::nullopt;
}

} // namespace

OpenPanes::OpenPanes(std::filesystem::path folder) : _folder(std::move(folder)) {}

OpenPanes::~OpenPanes() {
    static_cast<void>(closed()); // nobody is left to be told
}

OpenPanes::Findings OpenPanes::takeDied(const std::filesystem::path& root) {
    const Descriptor folder = openFolder(_folder);
    if (!folder.isOpen()) {
        return errno == ENOENT ? Findings{}
                               : Findings{.problem = fileError(_folder, "cannot be opened", errno)};
    }
    const auto names = namesIn(folder);
    if (!names) {
        return {.problem = fileError(_folder, "cannot be read", names.error())};
    }
    Findings findings;
    std::optional<Left> last;
    const std::string device = deviceName(root);
    for (const std::string& name : *names) {
        auto left = takeFile(folder, name, device, [&](const std::string& what, int number) {
            if (!findings.problem) {
                findings.problem = fileError(_folder / name, what, number);
            }
        });
        const auto time = [](const Left& file) {
            return std::pair(file.written.tv_sec, file.written.tv_nsec);
        };
        if (left && (!last || time(*last) < time(*left))) {
            last = std::move(left);
        }
    }
    if (last) {
        findings.died = Died{.paneTitle = std::move(last->title)};
    }
    return findings;
}

std::expected<OpenPanes::Mark, Error> OpenPanes::makeMark() const {
    auto folder = provideFolder(_folder);
    if (!folder) {
        return std::unexpected(folder.error());
    }
    // Before its lock is taken, a host that starts may find the new file and clear it away.
    constexpr int mostTries = 8;
    for (int tries = 0; tries < mostTries; ++tries) {
        std::string name = newName();
        Descriptor file(::openat(folder->number(), name.c_str(),
                                 O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, fileMode));
        if (!file.isOpen()) {
            return std::unexpected(fileError(_folder / name, "cannot be made", errno));
        }
        struct stat status{};
        const auto taken = takeLock(file, status);
        if (!taken) {
            ::unlinkat(folder->number(), name.c_str(), 0);
            return std::unexpected(fileError(_folder / name, "cannot be locked", taken.error()));
        }
        if (*taken) {
            return Mark{std::move(*folder), std::move(file), std::move(name)};
        }
    }
    return std::unexpected(fileError(_folder, "cannot be used", EWOULDBLOCK));
}

std::expected<void, Error> OpenPanes::opened(const std::filesystem::path& root,
                                             std::string_view title) {
    const auto ended = closed();
    if (!ended) {
        return ended;
    }
    std::string bytes = deviceName(root);
    bytes += valueEnd;
    bytes += title;
    bytes += valueEnd;
    if (bytes.size() > mostBytes) {
        return std::unexpected(fileError(_folder, "cannot be written", EFBIG));
    }
    auto mark = makeMark();
    if (!mark) {
        return std::unexpected(mark.error());
    }
    if (const auto written = writeContent(mark->file, bytes); !written) {
        ::unlinkat(mark->folder.number(), mark->name.c_str(), 0);
        return std::unexpected(
            fileError(_folder / mark->name, "cannot be written", written.error()));
    }
    _mark.emplace(std::move(*mark));
    return {};
}

std::expected<void, Error> OpenPanes::closed() {
    if (!_mark) {
        return {};
    }
    // Empty it says nothing, where the folder lets no file be removed any more.
    const bool isEmpty = ::ftruncate(_mark->file.number(), 0) == 0;
    const bool isRemoved =
        ::unlinkat(_mark->folder.number(), _mark->name.c_str(), 0) == 0 || errno == ENOENT;
    const int number = errno;
    const auto path = _folder / _mark->name;
    _mark.reset();
    if (!isEmpty && !isRemoved) {
        return std::unexpected(fileError(path, "cannot be removed", number));
    }
    return {};
}

} // namespace nimbra::window

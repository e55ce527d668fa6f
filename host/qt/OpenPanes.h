#pragma once

#include "device/files/Descriptor.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

namespace nimbra::window {

/// Notices that an earlier host of a device died with a pane open. While a pane is open the host
/// has a file of its own in a folder that all hosts of the user share, and holds its lock; the
/// system lets the lock go however a process ends, so that a file whose lock nobody holds is left
/// from a host that died. No lock is waited for, and no link followed in the folder. One thread.
class OpenPanes {
public:
    /// What a host that died leaves.
    struct Died {
        /// The title of the pane that it had open.
        std::string paneTitle;
    };
    struct Findings {
        /// The host of the device that died last, where one did.
        std::optional<Died> died;
        /// The first thing that could not be read or removed. The rest has been seen all the same;
        /// what could not be removed is found again the next time.
        std::optional<Error> problem;
    };

    /// Uses `folder`, which need not exist before a pane opens.
    explicit OpenPanes(std::filesystem::path folder);
    OpenPanes(const OpenPanes&) = delete;
    OpenPanes& operator=(const OpenPanes&) = delete;
    /// Closes the pane in order.
    ~OpenPanes();

    /// What hosts of the device in `root` left when they died; it is removed, so that each death
    /// is told once, to one host. Hosts that live, and those of other devices, are left in peace.
    [[nodiscard]] Findings takeDied(const std::filesystem::path& root);

    /// Notes that a pane called `title` of the device in `root` opens, in the place of one that was
    /// open. An error is no reason not to open it: somebody whose disk is full or whose home cannot
    /// be written still wants to see the settings, and loses no more than the word about a crash.
    [[nodiscard]] std::expected<void, Error> opened(const std::filesystem::path& root,
                                                    std::string_view title);
    /// Notes that the pane is closed, if one is open. After an error the next host believes that
    /// this one died.
    [[nodiscard]] std::expected<void, Error> closed();

private:
    /// The file of this host.
    struct Mark {
        device::Descriptor folder;
        device::Descriptor file;
        std::string name;
    };

    [[nodiscard]] std::expected<Mark, Error> makeMark() const;

    std::filesystem::path _folder;
    /// Present while a pane is open that could be noted.
    std::optional<Mark> _mark;
};

} // namespace nimbra::window

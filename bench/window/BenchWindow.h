#pragma once

#include "host/core/scenario/TemporaryDirectory.h"
#include "host/qt/SettingsHost.h"

#include <QQuickItem>
#include <cstddef>
#include <memory>

namespace nimbra::bench {

/// A window on a device of its own with so many applications, painted into memory. Throws
/// `std::runtime_error` when it cannot be made, or a pane in it cannot be opened. Main thread,
/// after the application has been made.
class BenchWindow {
public:
    explicit BenchWindow(std::size_t applications);

    /// Opens the pane up to its first frame; gives back how long that took, in milliseconds, from
    /// when the pane's own list had been built.
    [[nodiscard]] double openPane();
    void closePane();
    /// Runs until a frame has been painted.
    void paint();

    [[nodiscard]] window::SettingsHost& host() { return *_host; }
    /// The list of the open pane.
    [[nodiscard]] QQuickItem& list();

private:
    host::TemporaryDirectory _directory;
    std::unique_ptr<window::SettingsHost> _host;
};

} // namespace nimbra::bench

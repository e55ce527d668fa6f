#include "bench/window/ManyRows.h"
#include "bench/window/MeteredApplication.h"
#include "bench/window/StartUp.h"
#include "host/core/scenario/TemporaryDirectory.h"

#include <exception>
#include <iostream>

// Prints what the window costs. It is painted into memory, on a desktop that says nothing.
int main(int count, char** words) {
    const auto state = nimbra::host::TemporaryDirectory::make();
    if (!state) {
        std::cerr << state.error().line() << '\n';
        return 1;
    }
    qputenv("QT_QPA_PLATFORM", "offscreen");
    qputenv("QT_QUICK_BACKEND", "software");
    // A frame is painted as soon as it is asked for.
    qputenv("QT_QPA_UPDATE_IDLE_TIME", "0");
    qputenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent");
    qputenv("XDG_STATE_HOME", state->path().c_str());
    qputenv("XDG_RUNTIME_DIR", state->path().c_str());
    try {
        nimbra::bench::measureStartUp();
        nimbra::bench::MeteredApplication application(count, words);
        nimbra::bench::measureManyRows(application);
    } catch (const std::exception& failure) {
        std::cerr << failure.what() << '\n';
        return 1;
    }
}

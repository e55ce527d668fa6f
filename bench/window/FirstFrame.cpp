#include "bench/window/FirstFrame.h"

#include <QCoreApplication>
#include <QQuickWindow>
#include <fstream>
#include <iostream>
#include <string>

namespace nimbra::bench {

namespace {

/// Of this program alone: what a process has used at most, as the system counts it for its parent,
/// goes back to before the program was loaded into it.
long peakKilobytes() {
    std::ifstream status("/proc/self/status");
    std::string word;
    long kilobytes = 0;
    while (status >> word) {
        if (word == "VmHWM:") {
            status >> kilobytes;
            break;
        }
    }
    return kilobytes;
}

} // namespace

void tellFirstFrame(QQuickWindow& window) {
    QObject::connect(
        &window, &QQuickWindow::frameSwapped, QCoreApplication::instance(),
        [] {
            std::cout << peakKilobytes() << std::endl;
            QCoreApplication::quit();
        },
        Qt::SingleShotConnection);
}

} // namespace nimbra::bench

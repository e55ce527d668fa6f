#include "bench/window/BenchWindow.h"

#include "bench/BenchDevice.h"
#include "bench/ValueOf.h"
#include "bench/window/Stopwatch.h"
#include "device/DeviceDirectory.h"
#include "host/core/PaneSession.h"

#include <QEventLoop>
#include <QQuickWindow>
#include <QTimer>
#include <chrono>
#include <stdexcept>
#include <utility>

namespace nimbra::bench {

BenchWindow::BenchWindow(std::size_t applications)
    : _directory(valueOf(host::TemporaryDirectory::make())) {
    window::Arguments arguments;
    arguments.root = _directory.path() / "device";
    arguments.bundle = BenchDevice::builtBundle();
    valueOf(device::createDeviceDirectory(*arguments.root, BenchDevice::describe(applications)));
    auto host = window::SettingsHost::make(arguments);
    if (!host) {
        throw std::runtime_error(host.error());
    }
    _host = std::move(*host);
    _host->window().show();
    paint();
}

double BenchWindow::openPane() {
    valueOf(_host->session().openPane({}));
    const Stopwatch stopwatch;
    _host->session().appear();
    _host->pump().run();
    paint();
    return stopwatch.milliseconds();
}

void BenchWindow::closePane() {
    _host->pane().goBack();
    // Until the page has slid away.
    while (_host->window().findChild<QQuickItem*>(QStringLiteral("panePage")) != nullptr) {
        paint();
    }
}

void BenchWindow::paint() {
    QEventLoop loop;
    QObject::connect(&_host->window(), &QQuickWindow::frameSwapped, &loop, &QEventLoop::quit);
    QTimer::singleShot(std::chrono::seconds(10), &loop, [&loop] { loop.exit(1); });
    _host->window().update();
    if (loop.exec() != 0) {
        throw std::runtime_error("the window is not painted");
    }
}

QQuickItem& BenchWindow::list() {
    auto* const page = _host->window().findChild<QQuickItem*>(QStringLiteral("panePage"));
    auto* const list =
        page == nullptr ? nullptr : page->findChild<QQuickItem*>(QStringLiteral("rows"));
    if (list == nullptr) {
        throw std::runtime_error("the pane has no list");
    }
    return *list;
}

} // namespace nimbra::bench

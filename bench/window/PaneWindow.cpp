#include "bench/window/FirstFrame.h"
#include "host/qt/SettingsHost.h"

#include <QGuiApplication>
#include <QQuickItem>
#include <QQuickWindow>
#include <iostream>

// What the host does that is told to show a row of the pane, up to its first frame; takes what the
// host takes.
int main(int count, char** words) {
    const auto arguments = nimbra::window::Arguments::parse(count, words);
    if (!arguments) {
        return arguments.error();
    }
    const QGuiApplication application(count, words);
    const auto host = nimbra::window::SettingsHost::make(*arguments);
    if (!host) {
        std::cerr << host.error() << '\n';
        return 1;
    }
    QQuickWindow& window = (*host)->window();
    window.show();
    if (const auto shown = (*host)->showRow(arguments->row.value_or("")); !shown) {
        std::cerr << shown.error() << '\n';
        return 1;
    }
    // A frame before the pane can be seen would not count.
    const auto* const page = window.findChild<QQuickItem*>(QStringLiteral("panePage"));
    if (page == nullptr || !page->isVisible() || page->mapToScene({}).x() != 0) {
        std::cerr << "the first frame does not show the pane\n";
        return 1;
    }
    nimbra::bench::tellFirstFrame(window);
    return QGuiApplication::exec();
}

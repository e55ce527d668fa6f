#include "host/core/ExitStatus.h"
#include "host/core/PaneSession.h"
#include "host/core/scenario/TerminationGuard.h"
#include "host/qt/ScenarioDrive.h"
#include "host/qt/Screenshot.h"
#include "host/qt/SettingsHost.h"

#include <QGuiApplication>
#include <QIcon>
#include <QImage>
#include <QMetaObject>
#include <QQuickWindow>
#include <QSemaphore>
#include <csignal>
#include <expected>
#include <iostream>
#include <memory>
#include <optional>
#include <string>
#include <unistd.h>

namespace nimbra::window {

namespace {

using host::exitBadInput;
using host::exitRefused;

int complain(const std::string& problem, int status) {
    std::cerr << "settingshost: " << problem << '\n';
    return status;
}

/// For the time in which the application is made: Qt ends a program without a display by a crash.
void tellWithoutDisplay(QtMsgType type, const QMessageLogContext& /*context*/,
                        const QString& /*message*/) {
    if (type == QtFatalMsg) {
        ::_exit(complain("there is no display that can be used", exitBadInput));
    }
}

using MadeHost = std::expected<std::unique_ptr<SettingsHost>, std::string>;

/// Closes the pane on the main thread, where it lives, as soon as `host` has been made; a pane that
/// hangs is not waited for long.
void closeInOrder(const MadeHost& host) {
    constexpr int patience = 5000;
    const auto closed = std::make_shared<QSemaphore>();
    QMetaObject::invokeMethod(
        qGuiApp,
        [&host, closed] {
            if (host && *host) {
                (*host)->closePane();
            }
            closed->release();
        },
        Qt::QueuedConnection);
    static_cast<void>(closed->tryAcquire(1, patience));
}

int runProgram(int count, char** words) {
    // Whoever starts this program may not care how its children end, but it does.
    static_cast<void>(std::signal(SIGCHLD, SIG_DFL));
    const auto arguments = Arguments::parse(count, words);
    if (!arguments) {
        return arguments.error();
    }
    const QtMessageHandler usual = qInstallMessageHandler(tellWithoutDisplay);
    const QGuiApplication application(count, words);
    qInstallMessageHandler(usual);
    QGuiApplication::setApplicationName(QStringLiteral("settingshost"));
    QGuiApplication::setDesktopFileName(QStringLiteral("com.vantrel.settingshost"));
    QGuiApplication::setWindowIcon(QIcon::fromTheme(QStringLiteral("com.vantrel.settingshost")));
    MadeHost host;
    // A scenario has its own guard, which takes its device away.
    std::optional<host::TerminationGuard> guard;
    if (!arguments->scenario) {
        guard.emplace([&host] { closeInOrder(host); });
    }
    host = SettingsHost::make(*arguments);
    if (!host) {
        return complain(host.error(), exitBadInput);
    }
    QQuickWindow& window = (*host)->window();
    window.show();
    if (arguments->row) {
        if (const auto shown = (*host)->showRow(*arguments->row); !shown) {
            return complain(shown.error(), exitRefused);
        }
    }
    std::optional<ScenarioDrive> drive;
    std::optional<Screenshot> screenshot;
    const auto takePicture = [&] {
        screenshot.emplace(window, (*host)->session());
        QObject::connect(&*screenshot, &Screenshot::taken, [&](const QImage& picture) {
            const std::string place = arguments->screenshot->string();
            const auto saved = Screenshot::save(picture, QString::fromStdString(place));
            QGuiApplication::exit(
                saved ? 0 : complain(place + ": cannot be written: " + saved.error(), exitRefused));
        });
        QObject::connect(&*screenshot, &Screenshot::gaveUp, [&] {
            QGuiApplication::exit(complain("the window does not come to rest", exitRefused));
        });
    };
    if ((*host)->player() != nullptr) {
        drive.emplace(**host);
        QObject::connect(&*drive, &ScenarioDrive::ended, [&](const QString& problem) {
            if (!problem.isEmpty()) {
                QGuiApplication::exit(complain(problem.toStdString(), exitRefused));
            } else if (arguments->screenshot) {
                takePicture();
            }
        });
    } else if (arguments->screenshot) {
        takePicture();
    }
    return QGuiApplication::exec();
}

} // namespace

} // namespace nimbra::window

int main(int count, char** words) {
    return nimbra::window::runProgram(count, words);
}

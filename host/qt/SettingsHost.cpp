#include "host/qt/SettingsHost.h"

#include "device/DevicePlatform.h"
#include "device/system/DeviceSettings.h"
#include "host/core/AccountCheck.h"
#include "host/core/BundleSearch.h"
#include "host/core/DeviceLocation.h"
#include "host/core/PaneSession.h"
#include "host/qt/ApplicationIcons.h"
#include "host/qt/Strings.h"

#include <QFontMetricsF>
#include <QGuiApplication>
#include <QQmlContext>
#include <QQmlIncubationController>
#include <QQuickItem>
#include <QQuickWindow>
#include <QThreadPool>
#include <QUrl>
#include <iostream>
#include <utility>

namespace nimbra::window {

namespace {

using Problem = std::unexpected<std::string>;

QUrl mainPage() {
    return {QStringLiteral("qrc:/qt/qml/Nimbra/Window/qml/Main.qml")};
}

/// What the user loses nothing by but a word later on; told where a terminal looks on.
void warn(const std::expected<void, Error>& outcome) {
    if (!outcome) {
        std::cerr << "settingshost: " << outcome.error().description << '\n';
    }
}

/// Makes the rows at once that a list in `window` is making ahead of where they are seen, whenever
/// any of `rows` are about to go: a list of Qt 6.4 that loses one half-made waits for it from then
/// on, and makes no other one ahead.
void finishAhead(QQuickWindow& window, const ShownRows& rows) {
    QObject::connect(&rows, &QAbstractItemModel::rowsAboutToBeRemoved, &window, [&window] {
        constexpr int milliseconds = 10;
        constexpr int turns = 100;
        QQmlIncubationController& controller = *window.incubationController();
        // One whose making takes the rows away cannot be finished here, however often it is tried.
        for (int turn = 0; turn < turns && controller.incubatingObjectCount() > 0; ++turn) {
            controller.incubateFor(milliseconds);
        }
    });
}

} // namespace

std::expected<std::unique_ptr<SettingsHost>, std::string>
SettingsHost::make(const Arguments& arguments) {
    std::unique_ptr<SettingsHost> host(new SettingsHost(arguments));
    if (auto started = host->start(arguments); !started) {
        return Problem(std::move(started.error()));
    }
    return host;
}

SettingsHost::SettingsHost(const Arguments& arguments)
    : _appearance(arguments.appearance), _openPanes(host::stateDirectory() / "settingshost"),
      _trace([](const std::string&) {}) {}

SettingsHost::~SettingsHost() {
    // The window looks at the models until it has gone.
    _window = nullptr;
    _pages.reset();
    _engine.reset();
    if (_session != nullptr && _session->isPaneOpen()) {
        warn(_openPanes.closed());
    }
}

void SettingsHost::closePane() {
    _session->closePane();
    _pump->run();
}

host::ScenarioPlayer* SettingsHost::player() {
    return _scenario ? &_scenario->player() : nullptr;
}

std::expected<void, std::string> SettingsHost::start(const Arguments& arguments) {
    readAhead();
    _metrics.setTextScale(_appearance.textScale());
    connect(&_appearance, &Appearance::textScaleChanged, this,
            [this] { _metrics.setTextScale(_appearance.textScale()); });
    if (auto started = startSession(arguments); !started) {
        return started;
    }
    _bundle = arguments.bundle.value_or(host::findPaneBundle(_session->root()));
    makeModels(arguments);
    QString notice;
    if (!_scenario) {
        // A picture is made for a script: the word about a crash waits for somebody who reads it.
        if (!arguments.screenshot) {
            notice = noticeOfDied();
        }
        if (arguments.row) {
            // Before there is a window: nothing slides then, and nothing below has to be made.
            _pane->open();
        }
        if (!_pane->isOpen()) {
            if (const auto shown = _pane->showAccount(); !shown) {
                return Problem(shown.error().description);
            }
        }
    }
    return loadWindow(arguments, notice);
}

void SettingsHost::readAhead() {
    // The machine's fonts: a pane is measured with them as soon as it opens.
    QThreadPool::globalInstance()->start(
        [] { static_cast<void>(QFontMetricsF(QGuiApplication::font()).height()); });
    _engine.emplace();
    _engine->addImportPath(QStringLiteral("qrc:/qt/qml"));
    // The pages import Qt Quick, which comes with this thread's help only; all else comes without.
    QQmlComponent(&*_engine).setData("import QtQuick\nItem {}", QUrl());
    _pages.emplace(&*_engine, mainPage(), QQmlComponent::Asynchronous);
}

std::expected<void, std::string> SettingsHost::startSession(const Arguments& arguments) {
    if (arguments.scenario) {
        auto scenario = host::ScenarioSession::prepare({.file = arguments.scenario->string(),
                                                        .bundle = arguments.bundle,
                                                        .locale = arguments.locale,
                                                        .viewMetrics = &_metrics},
                                                       _trace);
        if (!scenario) {
            return Problem(scenario.error().description);
        }
        _scenario = std::move(*scenario);
        _session = &_scenario->session();
        return {};
    }
    const auto root = arguments.root.value_or(host::defaultDeviceDirectory());
    const auto provided = host::provideDevice(root);
    if (!provided) {
        return Problem(provided.error().description);
    }
    if (*provided) {
        std::cerr << "settingshost: made the sample device in " << root.string() << '\n';
    }
    auto session = host::PaneSession::start({.root = root,
                                             .bundle = arguments.bundle,
                                             .locale = arguments.locale,
                                             .viewMetrics = &_metrics});
    if (!session) {
        return Problem(session.error().description);
    }
    _ownSession = std::move(*session);
    _session = _ownSession.get();
    if (arguments.account) {
        if (const auto known = host::checkAccount(*_session, *arguments.account); !known) {
            return Problem(known.error().description);
        }
    }
    return {};
}

void SettingsHost::makeModels(const Arguments& arguments) {
    _texts.emplace(_session->device().settings().localeIdentifier());
    _pump.emplace(*_session);
    const DrawnViews::Look look{
        .metrics = _metrics,
        .pictureUrl = [this](const std::string& name) { return pictureUrl(name); },
        .isMirrored = _texts->isRightToLeft()};
    _pane.emplace(*_session, *_pump,
                  host::PaneEntry{.account = arguments.account, .firstSetup = arguments.firstSetup},
                  look);
    _screen.emplace(*_session, *_pump, look);
    _sharing.emplace(*_session, *_pump, *_texts);
    _session->setRowVisibility([this](const Specifier& row) { return isRowShown(row); });
    watchPane();
}

void SettingsHost::watchPane() {
    if (_scenario) {
        return;
    }
    // A pane may die while it opens.
    connect(&*_pane, &PaneModel::paneOpening, this, [this](const QString& title) {
        warn(_openPanes.opened(_session->root(), title.toStdString()));
    });
    connect(&*_pane, &PaneModel::paneClosed, this, [this] { warn(_openPanes.closed()); });
    connect(qGuiApp, &QGuiApplication::applicationStateChanged, this,
            [this](Qt::ApplicationState state) {
                if (state == Qt::ApplicationActive) {
                    _pane->becomeActive();
                }
            });
}

QString SettingsHost::noticeOfDied() {
    const auto findings = _openPanes.takeDied(_session->root());
    if (findings.problem) {
        warn(std::unexpected(*findings.problem));
    }
    return findings.died ? _texts->text(QStringLiteral("died"), qString(findings.died->paneTitle))
                         : QString();
}

std::expected<void, std::string> SettingsHost::loadWindow(const Arguments& arguments,
                                                          const QString& notice) {
    // NOLINTNEXTLINE(cppcoreguidelines-owning-memory): the engine owns it
    _engine->addImageProvider(QLatin1String(ApplicationIcons::kProvider), new ApplicationIcons);
    QQmlContext* const context = _engine->rootContext();
    context->setContextProperty(QStringLiteral("appearance"), &_appearance);
    context->setContextProperty(QStringLiteral("texts"), &*_texts);
    context->setContextProperty(QStringLiteral("pane"), &*_pane);
    context->setContextProperty(QStringLiteral("presented"), &*_screen);
    context->setContextProperty(QStringLiteral("sharing"), &*_sharing);

    _engine->setInitialProperties({{QStringLiteral("width"), arguments.size.width()},
                                   {QStringLiteral("height"), arguments.size.height()},
                                   {QStringLiteral("notice"), notice}});
    _engine->load(mainPage());
    _pages.reset();
    if (_engine->rootObjects().isEmpty()) {
        return Problem("the window cannot be made");
    }
    _window = qobject_cast<QQuickWindow*>(_engine->rootObjects().constFirst());
    // The platform says later how large the window is: until then a row is found by this.
    _window->contentItem()->setSize(_window->size());
    finishAhead(*_window, *_pane->accountRows());
    finishAhead(*_window, *_pane->rows());
    finishAhead(*_window, *_pane->detailRows());
    return {};
}

std::expected<void, std::string> SettingsHost::showRow(const std::string& name) {
    _pane->open();
    if (!_pane->isOpen()) {
        return Problem("the page cannot be opened");
    }
    if (const auto row = _session->row(name); !row) {
        return Problem(row.error().explanation);
    }
    QVariant isShown;
    QMetaObject::invokeMethod(_window, "showRow", Q_RETURN_ARG(QVariant, isShown),
                              Q_ARG(QVariant, qString(name)));
    return isShown.toBool() ? std::expected<void, std::string>()
                            : Problem("the row cannot be shown");
}

bool SettingsHost::isRowShown(const Specifier& row) {
    // A pane may open before the window, and closes after it.
    if (_window == nullptr) {
        return false;
    }
    const int place = _pane->rows()->indexOf(row);
    QVariant isShown;
    if (place >= 0) {
        QMetaObject::invokeMethod(_window, "isRowShown", Q_RETURN_ARG(QVariant, isShown),
                                  Q_ARG(QVariant, place));
    }
    return isShown.toBool();
}

QString SettingsHost::pictureUrl(const std::string& name) const {
    // The one with the most pixels, as everywhere.
    for (const char* const scale : {"@3x", "@2x", ""}) {
        const auto file = _bundle / (name + scale + ".png");
        std::error_code ignored;
        if (std::filesystem::is_regular_file(file, ignored)) {
            return QUrl::fromLocalFile(qString(file.string())).toString();
        }
    }
    return {};
}

} // namespace nimbra::window

#include "tests/host/qt/WindowFixture.h"

#include "device/DeviceDirectory.h"
#include "device/DevicePlatform.h"
#include "device/json/JsonReader.h"
#include "device/store/DeviceAccountStore.h"
#include "device/store/DevicePrivacyConsentStore.h"
#include "host/core/BundleSearch.h"
#include "host/core/DeviceLocation.h"
#include "host/core/PaneSession.h"
#include "host/qt/OpenPanes.h"
#include "tests/device/TestFiles.h"
#include "tests/support/ProgramRun.h"

#include <QCoreApplication>
#include <QQmlIncubationController>
#include <QQuickWindow>
#include <QTest>
#include <QTimer>
#include <algorithm>
#include <chrono>
#include <csignal>
#include <iostream>
#include <iterator>
#include <sys/wait.h>
#include <unistd.h>

namespace nimbra::window {

namespace {

/// `ListView.Contain`: a list moves no further than it must for all of a row to be seen.
constexpr int contain = 4;

void collect(QAccessibleInterface* parent, std::vector<QAccessibleInterface*>& found) {
    for (int index = 0; index < parent->childCount(); ++index) {
        if (QAccessibleInterface* const child = parent->child(index);
            child != nullptr && !child->state().invisible) {
            found.push_back(child);
            collect(child, found);
        }
    }
}

/// The part of `item` that takes the mouse: of a row, its card.
const QQuickItem* touchedPartOf(QQuickItem* item) {
    for (QQuickItem* const part : item->findChildren<QQuickItem*>()) {
        if (part->inherits("QQuickMouseArea")) {
            return part;
        }
    }
    return item;
}

/// A page that complains is wrong somewhere, whatever the test looks at.
void takeMessage(QtMsgType type, const QMessageLogContext& /*context*/, const QString& message) {
    if (type == QtDebugMsg || type == QtInfoMsg) {
        std::cerr << message.toStdString() << '\n';
    } else {
        ADD_FAILURE() << message.toStdString();
    }
}

QQuickItem* itemOf(QAccessibleInterface* accessible) {
    return qobject_cast<QQuickItem*>(accessible->object());
}

} // namespace

WindowTest::WindowTest() {
    std::filesystem::create_directories(home());
    setEnvironment("HOME", home().string());
    setEnvironment("XDG_STATE_HOME", place("state").string());
    setEnvironment("XDG_CONFIG_HOME", place("config").string());
    // What the pages tell screen readers they tell from the beginning.
    QAccessible::setActive(true);
    _messageHandler = qInstallMessageHandler(takeMessage);
}

WindowTest::~WindowTest() {
    _host.reset();
    qInstallMessageHandler(_messageHandler);
    for (const auto& [name, value] : _environment) {
        if (value) {
            qputenv(name.c_str(), *value);
        } else {
            qunsetenv(name.c_str());
        }
    }
}

void WindowTest::setEnvironment(const char* name, const std::string& value) {
    _environment.try_emplace(name, qEnvironmentVariableIsSet(name) ? std::optional(qgetenv(name))
                                                                   : std::nullopt);
    qputenv(name, QByteArray::fromStdString(value));
}

void WindowTest::makeDevice(const std::string& description) {
    const auto reader = device::JsonReader::parse(description, "description");
    ASSERT_TRUE(reader) << reader.error();
    const auto given = device::readDeviceDescription(*reader);
    ASSERT_FALSE(reader->problem()) << *reader->problem();
    _description = given.description;
    const auto made = device::createDeviceDirectory(root(), _description, host::findDeviceParts());
    ASSERT_TRUE(made) << made.error();
}

void WindowTest::makeSampleDevice() {
    makeDevice(test::contentOf(host::sampleDescription()));
}

void WindowTest::makeUsedDevice(const std::string& more) {
    makeDevice(R"({"accounts": [{"identifier": "primary", "primary": true, "usesStratafile": true,
                                 "enabled": ["kAccountDataclassTidewater"]}],
        "documents": {"identity": "somebody"}, "tool": null,
        "apps": [{"identifier": "notes", "name": "Notes"},
                 {"identifier": "atlas", "name": "Atlas"}],
        "consent": [{"service": "kPRVServiceTidewater", "bundle": "notes", "granted": true},
                    {"service": "kPRVServiceTidewater", "bundle": "atlas", "granted": false}])" +
               more + '}');
}

void WindowTest::dieWithThePaneOpen() const {
    const pid_t process = ::fork();
    if (process == 0) {
        OpenPanes panes(host::stateDirectory() / "settingshost");
        const bool isOpen = panes.opened(root(), "Nimbra Drive").has_value();
        static_cast<void>(::raise(isOpen ? SIGKILL : SIGTERM));
    }
    int status = 0;
    ASSERT_EQ(::waitpid(process, &status, 0), process);
    ASSERT_EQ(test::exitStatusOf(status), -SIGKILL);
}

Arguments WindowTest::arguments() const {
    Arguments arguments;
    arguments.root = root();
    arguments.bundle = NIMBRA_PANE_BUNDLE;
    arguments.appearance = {
        .dark = false, .highContrast = false, .reducedMotion = true, .textScale = 1};
    return arguments;
}

void WindowTest::start(const Arguments& arguments) {
    auto made = SettingsHost::make(arguments);
    ASSERT_TRUE(made) << made.error();
    _host = std::move(*made);
    session().device().accountStore().planSaveOutcomes(_description.saveFaults);
    session().device().privacyConsentStore().planSetOutcomes(_description.consentSetFaults);
    window().show();
    window().requestActivate();
    ASSERT_TRUE(QTest::qWaitForWindowActive(&window()));
    settle();
}

void WindowTest::openPane(const Arguments& arguments) {
    ASSERT_NO_FATAL_FAILURE(start(arguments));
    ASSERT_EQ(labels().size(), 1U);
    click(row(labels().front()));
    ASSERT_TRUE(pane().isOpen());
}

bool WindowTest::waitFor(const std::function<bool()>& isSo) {
    QTimer limit;
    limit.setSingleShot(true);
    limit.start(std::chrono::minutes(1));
    while (!isSo()) {
        if (!limit.isActive()) {
            return false;
        }
        QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
    }
    return true;
}

void WindowTest::settle() {
    EXPECT_TRUE(waitFor([this] { return session().isSettled(); }));
    QCoreApplication::processEvents();
    // A frame, for which lists are laid out.
    static_cast<void>(window().grabWindow());
    // Rows beyond the edges are made by and by.
    EXPECT_TRUE(
        waitFor([this] { return window().incubationController()->incubatingObjectCount() == 0; }));
    QCoreApplication::processEvents();
}

std::vector<QQuickItem*> WindowTest::shownItems(QQuickItem* item) {
    std::vector<QQuickItem*> items;
    if (item->isVisible()) {
        items.push_back(item);
        for (QQuickItem* const child : item->childItems()) {
            std::ranges::copy(shownItems(child), std::back_inserter(items));
        }
    }
    return items;
}

QQuickItem* WindowTest::named(const char* objectName) {
    for (QQuickItem* const item : shownItems(window().contentItem())) {
        if (item->objectName() == QLatin1String(objectName) && item->isEnabled()) {
            return item;
        }
    }
    return nullptr;
}

QQuickItem* WindowTest::list() {
    // Pages lie over each other in the order in which they were opened.
    QQuickItem* top = nullptr;
    for (QQuickItem* const item : shownItems(window().contentItem())) {
        if (item->objectName() == QLatin1String("rows")) {
            top = item;
        }
    }
    return top;
}

QQuickItem* WindowTest::row(const std::string& label) {
    QQuickItem* const rows = list();
    auto* const model = qvariant_cast<ShownRows*>(rows->property("model"));
    const int index = model->indexOf(QString::fromStdString(label));
    if (index < 0) {
        return nullptr;
    }
    QMetaObject::invokeMethod(rows, "bringTo", Q_ARG(QVariant, index), Q_ARG(QVariant, contain));
    settle();
    QQuickItem* found = nullptr;
    QMetaObject::invokeMethod(rows, "itemAtIndex", Q_RETURN_ARG(QQuickItem*, found),
                              Q_ARG(int, index));
    return found;
}

std::vector<std::string> WindowTest::labels() {
    const auto* const model = qvariant_cast<ShownRows*>(list()->property("model"));
    std::vector<std::string> labels;
    for (int row = 0; row < model->rowCount(); ++row) {
        if (model->isRow(row)) {
            labels.push_back(model->labelOf(row).toStdString());
        }
    }
    return labels;
}

std::vector<QAccessibleInterface*> WindowTest::accessibles() {
    std::vector<QAccessibleInterface*> found;
    collect(QAccessible::queryAccessibleInterface(&window()), found);
    return found;
}

QQuickItem* WindowTest::control(const QString& name, QAccessible::Role role) {
    for (QAccessibleInterface* const candidate : accessibles()) {
        if (candidate->role() == role && candidate->text(QAccessible::Name) == name &&
            itemOf(candidate) != nullptr && itemOf(candidate)->isEnabled()) {
            return itemOf(candidate);
        }
    }
    return nullptr;
}

bool WindowTest::isSaid(const QString& text) {
    return std::ranges::any_of(accessibles(), [&](QAccessibleInterface* candidate) {
        return candidate->text(QAccessible::Name) == text;
    });
}

std::string WindowTest::focusedName() {
    QQuickItem* const item = window().activeFocusItem();
    return item == nullptr ? "nothing" : nameOf(item);
}

QAccessibleInterface* WindowTest::accessible(QQuickItem* item) {
    return QAccessible::queryAccessibleInterface(item);
}

std::string WindowTest::nameOf(QQuickItem* item) {
    QAccessibleInterface* const found = item == nullptr ? nullptr : accessible(item);
    return found == nullptr ? "" : found->text(QAccessible::Name).toStdString();
}

std::string WindowTest::descriptionOf(QQuickItem* item) {
    QAccessibleInterface* const found = item == nullptr ? nullptr : accessible(item);
    return found == nullptr ? "" : found->text(QAccessible::Description).toStdString();
}

QAccessible::State WindowTest::stateOf(QQuickItem* item) {
    QAccessibleInterface* const found = item == nullptr ? nullptr : accessible(item);
    return found == nullptr ? QAccessible::State() : found->state();
}

void WindowTest::click(QQuickItem* item) {
    ASSERT_NE(item, nullptr);
    const QQuickItem* const target = touchedPartOf(item);
    const QPointF middle = target->mapToScene(QPointF(target->width() / 2, target->height() / 2));
    ASSERT_TRUE(QRectF(0, 0, window().width(), window().height()).contains(middle));
    QTest::mouseClick(&window(), Qt::LeftButton, Qt::NoModifier, middle.toPoint());
    settle();
}

void WindowTest::key(Qt::Key key, Qt::KeyboardModifiers modifiers) {
    QTest::keyClick(&window(), key, modifiers);
    settle();
}

void WindowTest::type(const QString& text) {
    for (const QChar character : text) {
        QTest::keyClick(&window(), character.toLatin1());
    }
    settle();
}

void WindowTest::act(QQuickItem* item, const QString& action) {
    ASSERT_NE(item, nullptr);
    QAccessibleActionInterface* const actions = accessible(item)->actionInterface();
    ASSERT_NE(actions, nullptr);
    ASSERT_TRUE(actions->actionNames().contains(action))
        << actions->actionNames().join(QLatin1Char(' ')).toStdString();
    actions->doAction(action);
    settle();
}

} // namespace nimbra::window

#pragma once

#include "device/DeviceDescription.h"
#include "host/qt/SettingsHost.h"
#include "tests/support/TemporaryDirectory.h"

#include <QAccessible>
#include <QQuickItem>
#include <QQuickWindow>
#include <filesystem>
#include <functional>
#include <gtest/gtest.h>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace nimbra::window {

/// A window on a device of its own, which the test uses as a person does: with the mouse, with keys
/// and through what a screen reader is told. Nothing moves, so that all is where it will be, and
/// nothing is waited for but events. A warning of Qt's or of a page's fails the test.
class WindowTest : public testing::Test {
protected:
    WindowTest();
    ~WindowTest() override;

    /// Makes the device that the description is of. Its planned faults come true in the windows
    /// that are started on it.
    void makeDevice(const std::string& description);
    /// The sample device: every kind of row, and twelve applications and more.
    void makeSampleDevice();
    /// A device whose page has the rows of an account that is in use, and `more` members.
    void makeUsedDevice(const std::string& more = {});
    /// Another host of the device dies while it has the pane open.
    void dieWithThePaneOpen() const;

    /// What a window on the device is started with; a test may change it.
    [[nodiscard]] Arguments arguments() const;
    void start() { start(arguments()); }
    void start(const Arguments& arguments);
    /// Starts, and goes to the pane as the user does, by the row of the account's page.
    void openPane() { openPane(arguments()); }
    void openPane(const Arguments& arguments);

    /// Gives the window its turns until nothing is left to do and all is drawn.
    void settle();
    /// Gives the window its turns until `isSo`; false where that does not come.
    [[nodiscard]] bool waitFor(const std::function<bool()>& isSo);

    /// Until the test has ended.
    void setEnvironment(const char* name, const std::string& value);

    // What is there.

    [[nodiscard]] QQuickWindow& window() { return _host->window(); }
    [[nodiscard]] host::PaneSession& session() { return _host->session(); }
    [[nodiscard]] PaneModel& pane() { return _host->pane(); }
    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    /// The user's own folder.
    [[nodiscard]] std::filesystem::path home() const { return _directory.path() / "home"; }
    /// A new place in the folder of the test.
    [[nodiscard]] std::filesystem::path place(const std::string& name) const {
        return _directory.path() / name;
    }

    /// The list of the page on top.
    [[nodiscard]] QQuickItem* list();
    /// The row that a scenario calls `label`, on the page on top, brought to where it is seen; null
    /// for none.
    [[nodiscard]] QQuickItem* row(const std::string& label);
    /// What a scenario calls the rows of the page on top that are no groups.
    [[nodiscard]] std::vector<std::string> labels();
    /// What is seen and is called so by its page; null for none.
    [[nodiscard]] QQuickItem* named(const char* objectName);
    /// What a screen reader finds under this name with this role, among what is seen and can be
    /// used; null for none.
    [[nodiscard]] QQuickItem* control(const QString& name,
                                      QAccessible::Role role = QAccessible::Button);
    /// Whether something that is seen says `text` to a screen reader.
    [[nodiscard]] bool isSaid(const QString& text);
    [[nodiscard]] std::string focusedName();

    /// All that is seen below `item`, itself first.
    [[nodiscard]] static std::vector<QQuickItem*> shownItems(QQuickItem* item);
    /// All that a screen reader finds, in its order.
    [[nodiscard]] std::vector<QAccessibleInterface*> accessibles();
    [[nodiscard]] static QAccessibleInterface* accessible(QQuickItem* item);
    [[nodiscard]] static std::string nameOf(QQuickItem* item);
    [[nodiscard]] static std::string descriptionOf(QQuickItem* item);
    [[nodiscard]] static QAccessible::State stateOf(QQuickItem* item);

    // What the user does; the window has settled afterwards.

    void click(QQuickItem* item);
    void key(Qt::Key key, Qt::KeyboardModifiers modifiers = Qt::NoModifier);
    void type(const QString& text);
    /// What a screen reader does for its user: the action called so.
    void act(QQuickItem* item, const QString& action);

    test::TemporaryDirectory _directory;
    /// What the device was made from.
    device::DeviceDescription _description;
    std::unique_ptr<SettingsHost> _host;

private:
    QtMessageHandler _messageHandler = nullptr;
    std::map<std::string, std::optional<QByteArray>> _environment;
};

} // namespace nimbra::window

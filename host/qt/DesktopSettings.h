#pragma once

#include <QDBusConnection>
#include <QDBusPendingCallWatcher>
#include <QMap>
#include <QObject>
#include <QString>
#include <QStringList>
#include <QVariant>
#include <QVariantMap>
#include <memory>
#include <optional>
#include <thread>

class QDBusMessage;

namespace nimbra::window {

/// What the desktop tells every program of its settings: its portal on the session bus. Nothing
/// here waits for the bus, not even for one that takes the connection and never says a word; only
/// the end waits for one that has yet to take it. Main thread only.
class DesktopSettings : public QObject {
    Q_OBJECT

public:
    /// The values by namespace and key, taken out of whatever variants they came in.
    using Values = QMap<QString, QVariantMap>;

    /// The address of the session bus, as the environment has it; empty where it has none.
    [[nodiscard]] static QString sessionBus();

    /// Asks for what stands in `namespaces`, in one call, and follows it from then on. Where no bus
    /// is at the address `bus`, nothing is ever told. `connection` is what Qt is to know the
    /// connection by, which is this object's alone.
    DesktopSettings(const QString& bus, QString connection, QStringList namespaces);
    DesktopSettings(const DesktopSettings&) = delete;
    DesktopSettings& operator=(const DesktopSettings&) = delete;
    ~DesktopSettings() override;

    /// Whether a portal that has answered is still there.
    [[nodiscard]] bool isThere() const { return _bus && _bus->isConnected() && !_owner.isEmpty(); }

Q_SIGNALS:
    /// A portal has answered, the first or one that took its place: these are all settings.
    void answered(const nimbra::window::DesktopSettings::Values& values);
    /// One setting of the portal that has answered is another one now; of any namespace.
    void changed(const QString& space, const QString& key, const QVariant& value);

private:
    Q_SLOT void takeOwner(const QDBusMessage& signal);
    Q_SLOT void takeChange(const QDBusMessage& signal);
    void follow(const QDBusConnection& bus);
    void ask();
    void takeAnswer();

    QString _connection;
    QStringList _namespaces;
    /// Nothing until it has been made.
    std::optional<QDBusConnection> _bus;
    /// Makes it.
    std::thread _connecting;
    /// The call that waits for its answer; null while none does.
    std::unique_ptr<QDBusPendingCallWatcher> _call;
    /// The portal that has answered, by its own name on the bus; empty while none has.
    QString _owner;
};

} // namespace nimbra::window

#pragma once

#include <QDBusConnection>
#include <QDBusPendingCallWatcher>
#include <QDBusServiceWatcher>
#include <QMap>
#include <QObject>
#include <QString>
#include <QStringList>
#include <QVariant>
#include <QVariantMap>
#include <memory>

class QDBusMessage;

namespace nimbra::window {

/// What the desktop tells every program of its settings: its portal on the session bus. Nothing
/// here waits for the bus. Main thread only.
class DesktopSettings : public QObject {
    Q_OBJECT

public:
    /// The values by namespace and key, taken out of whatever variants they came in.
    using Values = QMap<QString, QVariantMap>;

    /// Asks for what stands in `namespaces`, in one call, and follows it from then on. Where `bus`
    /// is not connected, nothing is ever told.
    DesktopSettings(QDBusConnection bus, QStringList namespaces);

    /// Whether a portal that has answered is still there.
    [[nodiscard]] bool isThere() const { return _bus.isConnected() && !_owner.isEmpty(); }

Q_SIGNALS:
    /// A portal has answered, the first or one that took its place: these are all settings.
    void answered(const nimbra::window::DesktopSettings::Values& values);
    /// One setting of the portal that has answered is another one now; of any namespace.
    void changed(const QString& space, const QString& key, const QVariant& value);

private:
    Q_SLOT void takeChange(const QDBusMessage& signal);
    void ask();
    void takeAnswer();

    QDBusConnection _bus;
    QStringList _namespaces;
    QDBusServiceWatcher _portal;
    /// The call that waits for its answer; null while none does.
    std::unique_ptr<QDBusPendingCallWatcher> _call;
    /// The portal that has answered, by its own name on the bus; empty while none has.
    QString _owner;
};

} // namespace nimbra::window

#pragma once

#include <QDBusConnection>
#include <QDBusMessage>
#include <QList>
#include <QMap>
#include <QObject>
#include <QString>
#include <QStringList>
#include <QVariant>
#include <QVariantList>
#include <QVariantMap>

namespace nimbra::test {

/// Whether the bus of `bus` is there. When this returns, all that was sent over `bus` has reached
/// it, and all that it had sent is here, for the event loop to deliver.
[[nodiscard]] bool askBus(const QDBusConnection& bus);

/// Stands for the desktop's portal on a bus, over a connection of its own.
class PortalStandIn : public QObject {
    Q_OBJECT
    Q_CLASSINFO("D-Bus Interface", "org.freedesktop.portal.Settings")

public:
    using Values = QMap<QString, QVariantMap>;

    /// Comes to the bus at `address` with `values`.
    PortalStandIn(const QString& address, Values values);
    PortalStandIn(const PortalStandIn&) = delete;
    PortalStandIn& operator=(const PortalStandIn&) = delete;
    /// Leaves the bus. The bus knows when this returns.
    ~PortalStandIn() override;

    /// Tells everybody that `key` of `space` is `value` now. The bus knows when this returns.
    void tell(const QString& space, const QString& key, const QVariant& value);
    /// The same with other arguments than the interface has.
    void tellNonsense(const QVariantList& arguments);
    /// Answers with this instead of its settings from now on.
    void answerWith(const QVariant& answer) { _answer = answer; }

    /// The namespaces that it was asked for, a list for each call.
    [[nodiscard]] const QList<QStringList>& questions() const { return _questions; }

public Q_SLOTS:
    void ReadAll(const QStringList& spaces, // NOLINT(readability-identifier-naming): on the bus
                 const QDBusMessage& question);

private:
    QString _name;
    QDBusConnection _bus;
    Values _values;
    QVariant _answer;
    QList<QStringList> _questions;
};

} // namespace nimbra::test

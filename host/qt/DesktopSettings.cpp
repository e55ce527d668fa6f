#include "host/qt/DesktopSettings.h"

#include <QDBusArgument>
#include <QDBusMessage>
#include <QDBusPendingCall>
#include <QDBusVariant>
#include <QFileInfo>
#include <QUrl>
#include <QVariantList>
#include <utility>

namespace nimbra::window {

namespace {

const QString& service() {
    static const QString name = QStringLiteral("org.freedesktop.portal.Desktop");
    return name;
}

const QString& object() {
    static const QString path = QStringLiteral("/org/freedesktop/portal/desktop");
    return path;
}

const QString& interface() {
    static const QString name = QStringLiteral("org.freedesktop.portal.Settings");
    return name;
}

/// What the bus itself is called, as a service and an interface.
const QString& busName() {
    static const QString name = QStringLiteral("org.freedesktop.DBus");
    return name;
}

const QString& busObject() {
    static const QString path = QStringLiteral("/org/freedesktop/DBus");
    return path;
}

QDBusMessage toBus(const QString& method) {
    return QDBusMessage::createMethodCall(busName(), busObject(), busName(), method);
}

/// Asks the bus for the signals that `rule` is about.
void subscribe(const QDBusConnection& bus, const QString& rule) {
    QDBusMessage call = toBus(QStringLiteral("AddMatch"));
    call << rule;
    static_cast<void>(bus.asyncCall(call));
}

/// Some portals put a value into a variant within the variant.
QVariant unwrapped(QVariant value) {
    while (value.metaType() == QMetaType::fromType<QDBusVariant>()) {
        value = value.value<QDBusVariant>().variant();
    }
    return value;
}

} // namespace

QString DesktopSettings::sessionBus() {
    QString address = qEnvironmentVariable("DBUS_SESSION_BUS_ADDRESS");
    const QString folder = qEnvironmentVariable("XDG_RUNTIME_DIR");
    const QString socket = folder + QStringLiteral("/bus");
    if (address.isEmpty() && !folder.isEmpty() && QFileInfo::exists(socket)) {
        // Where every bus of a user stands that nobody has named.
        address = QStringLiteral("unix:path=") +
                  QString::fromLatin1(QUrl::toPercentEncoding(socket, "/"));
    }
    return address;
}

DesktopSettings::DesktopSettings(const QString& bus, QString connection, QStringList namespaces)
    : _connection(std::move(connection)), _namespaces(std::move(namespaces)) {
    if (bus.isEmpty()) {
        return;
    }
    _connecting = std::thread([this, bus] {
        // As to a peer: to a bus, the library would wait until it has greeted.
        const QDBusConnection made = QDBusConnection::connectToPeer(bus, _connection);
        QMetaObject::invokeMethod(this, [this, made] { follow(made); }, Qt::QueuedConnection);
    });
}

DesktopSettings::~DesktopSettings() {
    if (_connecting.joinable()) {
        _connecting.join();
        QDBusConnection::disconnectFromPeer(_connection);
    }
}

void DesktopSettings::follow(const QDBusConnection& bus) {
    if (!bus.isConnected()) {
        return;
    }
    _bus = bus;
    // The bus takes these in their order; nobody waits for what it says to the first ones. One
    // that refuses them answers the question with an error, or ends the connection.
    static_cast<void>(_bus->asyncCall(toBus(QStringLiteral("Hello"))));
    subscribe(*_bus, QStringLiteral("type='signal',sender='%1',interface='%1',"
                                    "member='NameOwnerChanged',arg0='%2'")
                         .arg(busName(), service()));
    // From anybody: who the portal is, the answer says.
    subscribe(*_bus,
              QStringLiteral("type='signal',path='%1',interface='%2',member='SettingChanged'")
                  .arg(object(), interface()));
    _bus->connect(QString(), busObject(), busName(), QStringLiteral("NameOwnerChanged"), this,
                  SLOT(takeOwner(QDBusMessage)));
    _bus->connect(QString(), object(), interface(), QStringLiteral("SettingChanged"), this,
                  SLOT(takeChange(QDBusMessage)));
    ask();
}

void DesktopSettings::takeOwner(const QDBusMessage& signal) {
    if (signal.service() != busName() || signal.signature() != QStringLiteral("sss") ||
        signal.arguments().at(0) != service()) {
        return;
    }
    _owner.clear();
    _call.reset();
    if (!signal.arguments().at(2).toString().isEmpty()) {
        ask();
    }
}

void DesktopSettings::ask() {
    QDBusMessage question =
        QDBusMessage::createMethodCall(service(), object(), interface(), QStringLiteral("ReadAll"));
    question << _namespaces;
    _call = std::make_unique<QDBusPendingCallWatcher>(_bus->asyncCall(question));
    connect(_call.get(), &QDBusPendingCallWatcher::finished, this, &DesktopSettings::takeAnswer);
}

void DesktopSettings::takeAnswer() {
    const QDBusMessage answer = _call->reply();
    // It is the one that is telling so.
    _call.release()->deleteLater();
    // A desktop without a portal, or with one that knows no settings, is nothing out of the
    // ordinary: there is nothing to follow then, until another portal comes.
    if (answer.type() != QDBusMessage::ReplyMessage ||
        answer.signature() != QStringLiteral("a{sa{sv}}")) {
        return;
    }
    _owner = answer.service();
    auto values = qdbus_cast<Values>(answer.arguments().constFirst());
    for (QVariantMap& space : values) {
        for (QVariant& value : space) {
            value = unwrapped(std::move(value));
        }
    }
    Q_EMIT answered(values);
}

void DesktopSettings::takeChange(const QDBusMessage& signal) {
    // What was said before the answer stands in the answer.
    if (_owner.isEmpty() || signal.service() != _owner ||
        signal.signature() != QStringLiteral("ssv")) {
        return;
    }
    const QVariantList arguments = signal.arguments();
    Q_EMIT changed(arguments.at(0).toString(), arguments.at(1).toString(),
                   unwrapped(arguments.at(2)));
}

} // namespace nimbra::window

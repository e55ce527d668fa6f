#include "host/qt/DesktopSettings.h"

#include <QDBusArgument>
#include <QDBusMessage>
#include <QDBusPendingCall>
#include <QDBusVariant>
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

/// Some portals put a value into a variant within the variant.
QVariant unwrapped(QVariant value) {
    while (value.metaType() == QMetaType::fromType<QDBusVariant>()) {
        value = value.value<QDBusVariant>().variant();
    }
    return value;
}

} // namespace

DesktopSettings::DesktopSettings(QDBusConnection bus, QStringList namespaces)
    : _bus(std::move(bus)), _namespaces(std::move(namespaces)) {
    if (!_bus.isConnected()) {
        return;
    }
    connect(&_portal, &QDBusServiceWatcher::serviceOwnerChanged, this,
            [this](const QString&, const QString&, const QString& owner) {
                _owner.clear();
                _call.reset();
                if (!owner.isEmpty()) {
                    ask();
                }
            });
    _portal.setWatchMode(QDBusServiceWatcher::WatchForOwnerChange);
    _portal.setConnection(_bus);
    _portal.addWatchedService(service());
    // From anybody: to follow the service by its name, the library would wait for the bus to say
    // who that is. The answer says it as well.
    _bus.connect(QString(), object(), interface(), QStringLiteral("SettingChanged"), this,
                 SLOT(takeChange(QDBusMessage)));
    ask();
}

void DesktopSettings::ask() {
    QDBusMessage question =
        QDBusMessage::createMethodCall(service(), object(), interface(), QStringLiteral("ReadAll"));
    question << _namespaces;
    _call = std::make_unique<QDBusPendingCallWatcher>(_bus.asyncCall(question));
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

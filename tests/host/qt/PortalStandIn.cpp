#include "tests/host/qt/PortalStandIn.h"

#include <QDBusMetaType>
#include <QDBusVariant>
#include <QUuid>
#include <gtest/gtest.h>
#include <utility>

namespace nimbra::test {

namespace {

const QString& service() {
    static const QString name = QStringLiteral("org.freedesktop.portal.Desktop");
    return name;
}

const QString& object() {
    static const QString path = QStringLiteral("/org/freedesktop/portal/desktop");
    return path;
}

} // namespace

PortalStandIn::PortalStandIn(const QString& address, Values values)
    : _name(QUuid::createUuid().toString()), _bus(QDBusConnection::connectToBus(address, _name)),
      _values(std::move(values)) {
    qDBusRegisterMetaType<Values>();
    EXPECT_TRUE(_bus.registerObject(object(), this, QDBusConnection::ExportAllSlots));
    EXPECT_TRUE(_bus.registerService(service()));
}

PortalStandIn::~PortalStandIn() {
    _bus.unregisterService(service());
    QDBusConnection::disconnectFromBus(_name);
}

void PortalStandIn::ReadAll(const QStringList& spaces, const QDBusMessage& question) {
    _questions.append(spaces);
    Values asked;
    for (const QString& space : spaces) {
        if (_values.contains(space)) {
            asked.insert(space, _values.value(space));
        }
    }
    question.setDelayedReply(true);
    EXPECT_TRUE(
        _bus.send(question.createReply(_answer.isValid() ? _answer : QVariant::fromValue(asked))));
}

void PortalStandIn::tell(const QString& space, const QString& key, const QVariant& value) {
    tellNonsense({space, key, QVariant::fromValue(QDBusVariant(value))});
}

void PortalStandIn::tellNonsense(const QVariantList& arguments) {
    QDBusMessage signal =
        QDBusMessage::createSignal(object(), QStringLiteral("org.freedesktop.portal.Settings"),
                                   QStringLiteral("SettingChanged"));
    signal.setArguments(arguments);
    EXPECT_TRUE(_bus.send(signal));
    EXPECT_TRUE(askBus(_bus));
}

bool askBus(const QDBusConnection& bus) {
    const QDBusMessage answer = bus.call(QDBusMessage::createMethodCall(
        QStringLiteral("org.freedesktop.DBus"), QStringLiteral("/org/freedesktop/DBus"),
        QStringLiteral("org.freedesktop.DBus"), QStringLiteral("GetId")));
    return answer.type() == QDBusMessage::ReplyMessage;
}

} // namespace nimbra::test

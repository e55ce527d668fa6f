#include "bench/window/FirstFrame.h"

#include <QGuiApplication>
#include <QQmlApplicationEngine>
#include <QQuickWindow>
#include <QUrl>

int main(int count, char** words) {
    const QGuiApplication application(count, words);
    QQmlApplicationEngine engine;
    engine.load(QUrl(QStringLiteral("qrc:/qt/qml/Nimbra/EmptyWindow/EmptyWindow.qml")));
    if (engine.rootObjects().isEmpty()) {
        return 1;
    }
    nimbra::bench::tellFirstFrame(*qobject_cast<QQuickWindow*>(engine.rootObjects().constFirst()));
    return QGuiApplication::exec();
}

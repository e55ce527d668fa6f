#include <QFont>
#include <QGuiApplication>
#include <gtest/gtest.h>

int main(int count, char** words) {
    // Nothing of the machine's desktop decides how a window looks.
    qputenv("QT_QPA_PLATFORM", "offscreen");
    qputenv("QT_QUICK_BACKEND", "software");
    qputenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent");
    ::testing::InitGoogleTest(&count, words);
    const QGuiApplication application(count, words);
    QGuiApplication::setFont(QFont(QStringLiteral("DejaVu Sans")));
    return RUN_ALL_TESTS();
}

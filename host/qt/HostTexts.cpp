#include "host/qt/HostTexts.h"

#include "device/system/LanguageChain.h"
#include "host/qt/Strings.h"

#include <QFile>
#include <QJsonDocument>
#include <QLocale>

namespace nimbra::window {

namespace {

/// Empty for a language without texts.
QJsonObject textsIn(const std::string& language) {
    QFile file(QStringLiteral(":/texts/%1.json").arg(qString(language)));
    return file.open(QIODevice::ReadOnly) ? QJsonDocument::fromJson(file.readAll()).object()
                                          : QJsonObject();
}

} // namespace

HostTexts::HostTexts(const std::string& locale)
    : _isRightToLeft(QLocale(qString(locale)).textDirection() == Qt::RightToLeft) {
    for (const std::string& language : device::languageChain(locale)) {
        if (_texts.isEmpty()) {
            _texts = textsIn(language);
        }
    }
    if (_texts.isEmpty()) {
        _texts = textsIn("en");
    }
}

QString HostTexts::text(const QString& key) const {
    return _texts.value(key).toString(key);
}

QString HostTexts::text(const QString& key, const QString& argument) const {
    return text(key).arg(argument);
}

} // namespace nimbra::window

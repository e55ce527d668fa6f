#include "host/qt/ApplicationIcons.h"

#include <QFont>
#include <QFontMetricsF>
#include <QGuiApplication>
#include <QIcon>
#include <QPainter>
#include <QTextBoundaryFinder>
#include <algorithm>
#include <cstdint>

namespace nimbra::window {

namespace {

using namespace Qt::StringLiterals;

constexpr int kDefaultLength = 32;
constexpr int kLargestLength = 1024;
/// No icon has a longer name: it is that of a file.
constexpr qsizetype kLongestIconName = 200;
/// A character of a name that means well has fewer parts.
constexpr qsizetype kLongestLetter = 32;
/// In an address nothing happens to the characters of this encoding.
constexpr auto kEncoding = QByteArray::Base64UrlEncoding | QByteArray::OmitTrailingEquals;

/// A theme looks for a file of this name: only what cannot lead to another place is one.
bool isIconName(const QString& identifier) {
    return !identifier.isEmpty() && identifier.size() <= kLongestIconName &&
           !identifier.startsWith(u'.') && !identifier.contains(".."_L1) &&
           std::ranges::all_of(identifier, [](QChar character) {
               return (character.unicode() < 0x80 && character.isLetterOrNumber()) ||
                      character == u'.' || character == u'-' || character == u'_';
           });
}

QString firstCharacterOf(const QString& text) {
    const auto* const begin = std::ranges::find_if_not(text, [](QChar character) {
        return character.isSpace() || character.category() == QChar::Other_Control ||
               character.category() == QChar::Other_Format;
    });
    const QString rest(begin, std::min<qsizetype>(text.end() - begin, kLongestLetter));
    QTextBoundaryFinder characters(QTextBoundaryFinder::Grapheme, rest);
    return rest.left(std::max<qsizetype>(characters.toNextBoundary(), 0));
}

QString encoded(const QString& text) {
    return QString::fromLatin1(text.toUtf8().toBase64(kEncoding));
}

QString decoded(const QString& text) {
    return QString::fromUtf8(QByteArray::fromBase64(text.toLatin1(), kEncoding));
}

/// Spread over identifiers that differ in little, and the same on every machine.
std::uint32_t hashOf(const QString& text) {
    std::uint32_t hash = 2166136261U;
    const QByteArray utf8 = text.toUtf8();
    for (const char byte : utf8) {
        hash = (hash ^ static_cast<unsigned char>(byte)) * 16777619U;
    }
    return hash ^ (hash >> 16U);
}

int lengthFor(const QSize& requested) {
    const int width = requested.width();
    const int height = requested.height();
    const int asked = width > 0 && height > 0 ? std::min(width, height) : std::max(width, height);
    return asked > 0 ? std::min(asked, kLargestLength) : kDefaultLength;
}

QPixmap emptySquare(int length) {
    QPixmap square(length, length);
    square.fill(Qt::transparent);
    return square;
}

} // namespace

QUrl ApplicationIcons::sourceFor(const QString& identifier, const QString& name) {
    // The letter alone: another name with the same one needs no other picture.
    const QString source = u"image://%1/%2.%3"_s.arg(QLatin1String(kProvider), encoded(identifier),
                                                     encoded(letterFor(identifier, name)));
    return QUrl{source};
}

QString ApplicationIcons::letterFor(const QString& identifier, const QString& name) {
    QString letter = firstCharacterOf(name);
    if (letter.isEmpty()) {
        letter = firstCharacterOf(identifier);
    }
    // In upper case some become two.
    return firstCharacterOf(letter.toUpper());
}

QColor ApplicationIcons::colorFor(const QString& identifier) {
    return colors().at(hashOf(identifier) % colors().size());
}

const std::array<QColor, 8>& ApplicationIcons::colors() {
    static const std::array<QColor, 8> colors{QColor(0xB3, 0x26, 0x1E), QColor(0x9A, 0x4A, 0x00),
                                              QColor(0x66, 0x63, 0x00), QColor(0x2E, 0x75, 0x2E),
                                              QColor(0x00, 0x72, 0x78), QColor(0x1F, 0x5F, 0xBF),
                                              QColor(0x69, 0x3F, 0xC4), QColor(0xA8, 0x24, 0x7D)};
    return colors;
}

QPixmap ApplicationIcons::requestPixmap(const QString& id, QSize* size,
                                        const QSize& requestedSize) {
    const QString identifier = decoded(id.section(u'.', 0, 0));
    const int length = lengthFor(requestedSize);
    if (size != nullptr) {
        *size = QSize(length, length);
    }
    const QPixmap icon = themed(identifier, length);
    return !icon.isNull()
               ? icon
               : circle(identifier, firstCharacterOf(decoded(id.section(u'.', 1, 1))), length);
}

QPixmap ApplicationIcons::themed(const QString& identifier, int length) {
    if (!isIconName(identifier)) {
        return {};
    }
    const QIcon icon = QIcon::fromTheme(identifier);
    // A theme also offers what it has for the name up to a hyphen: that is another application.
    if (icon.isNull() || icon.name() != identifier) {
        return {};
    }
    QPixmap found = icon.pixmap(QSize(length, length), 1.0);
    if (found.isNull() || found.size() == QSize(length, length)) {
        return found;
    }
    // The theme has it smaller only, or not square.
    const QPixmap scaled =
        found.scaled(length, length, Qt::KeepAspectRatio, Qt::SmoothTransformation);
    QPixmap square = emptySquare(length);
    QPainter painter(&square);
    painter.drawPixmap((length - scaled.width()) / 2, (length - scaled.height()) / 2, scaled);
    return square;
}

QPixmap ApplicationIcons::circle(const QString& identifier, const QString& letter, int length) {
    QPixmap square = emptySquare(length);
    QPainter painter(&square);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.setPen(Qt::NoPen);
    painter.setBrush(colorFor(identifier));
    painter.drawEllipse(square.rect());

    constexpr double letterHeight = 0.5;
    constexpr double widestLetter = 0.7;
    QFont font = QGuiApplication::font();
    font.setPixelSize(std::max(1, qRound(length * letterHeight)));
    font.setWeight(QFont::DemiBold);
    const double width = QFontMetricsF(font).horizontalAdvance(letter);
    if (width > length * widestLetter) {
        font.setPixelSize(
            std::max(1, static_cast<int>(font.pixelSize() * length * widestLetter / width)));
    }
    painter.setFont(font);
    painter.setPen(Qt::white);
    painter.drawText(square.rect(), Qt::AlignCenter | Qt::TextSingleLine, letter);
    return square;
}

} // namespace nimbra::window

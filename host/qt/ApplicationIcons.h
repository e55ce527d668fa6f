#pragma once

#include <QColor>
#include <QPixmap>
#include <QQuickImageProvider>
#include <QSize>
#include <QString>
#include <QUrl>
#include <array>

namespace nimbra::window {

/// The icons of applications, each made when it is first drawn: the icon theme's, or else a letter
/// in a circle. The engine asks on the main thread, as for every provider of pixmaps. An image may
/// leave its size to the provider, which is 32 by 32 then; it is square otherwise, as large as the
/// smaller side that was asked for.
class ApplicationIcons final : public QQuickImageProvider {
public:
    /// Under which name the engine is given the provider.
    static constexpr const char* kProvider = "application";

    ApplicationIcons() : QQuickImageProvider(QQuickImageProvider::Pixmap) {}

    /// The source of the image of an application: the only addresses that have one of their own.
    /// Any text may be handed in.
    [[nodiscard]] static QUrl sourceFor(const QString& identifier, const QString& name);
    /// What stands in the circle: the first character of `name` as a person counts characters, in
    /// upper case; the identifier's where there is no name, and nothing where there is neither.
    [[nodiscard]] static QString letterFor(const QString& identifier, const QString& name);
    /// The circle's colour, for an identifier ever the same.
    [[nodiscard]] static QColor colorFor(const QString& identifier);
    /// Eight around the circle of hues, all dark enough for a white letter.
    [[nodiscard]] static const std::array<QColor, 8>& colors();

    /// `id` is what follows the provider's name in a source. An unknown one is an empty circle.
    QPixmap requestPixmap(const QString& id, QSize* size, const QSize& requestedSize) override;

private:
    [[nodiscard]] static QPixmap themed(const QString& identifier, int length);
    [[nodiscard]] static QPixmap circle(const QString& identifier, const QString& letter,
                                        int length);
};

} // namespace nimbra::window

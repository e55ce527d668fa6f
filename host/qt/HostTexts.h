#pragma once

#include <QJsonObject>
#include <QObject>
#include <QString>
#include <string>

namespace nimbra::window {

/// The window's own texts, in the languages of the pane: of its bars, its search field and its
/// share sheet. Main queue.
class HostTexts final : public QObject {
    Q_OBJECT
    /// Whether the language is written from right to left.
    Q_PROPERTY(bool rightToLeft READ isRightToLeft CONSTANT)

public:
    /// For a user of `locale`, a BCP 47 tag; in English where there is no better language.
    explicit HostTexts(const std::string& locale);

    /// The text that is called `key`; the key itself where there is none.
    Q_INVOKABLE [[nodiscard]] QString text(const QString& key) const;
    /// The same, with `argument` in the place of "%1".
    Q_INVOKABLE [[nodiscard]] QString text(const QString& key, const QString& argument) const;

    [[nodiscard]] bool isRightToLeft() const { return _isRightToLeft; }

private:
    QJsonObject _texts;
    bool _isRightToLeft;
};

} // namespace nimbra::window

#pragma once

#include <QGuiApplication>
#include <vector>

namespace nimbra::bench {

/// An application that notes how long its windows take for each frame: to lay out what has changed,
/// and to paint it.
class MeteredApplication final : public QGuiApplication {
public:
    using QGuiApplication::QGuiApplication;

    bool notify(QObject* receiver, QEvent* event) override;

    /// The frames since the last call, in milliseconds.
    [[nodiscard]] std::vector<double> takeFrames();

private:
    std::vector<double> _frames;
};

} // namespace nimbra::bench

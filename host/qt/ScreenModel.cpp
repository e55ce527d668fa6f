#include "host/qt/ScreenModel.h"

#include "host/core/PaneSession.h"
#include "host/core/ScreenDescription.h"
#include "host/qt/SessionPump.h"
#include "host/qt/Strings.h"

#include <utility>

namespace nimbra::window {

ScreenModel::ScreenModel(host::PaneSession& session, SessionPump& pump, DrawnViews::Look look)
    : _session(session), _pump(pump), _views(std::move(look)) {
    connect(&_pump, &SessionPump::ran, this, &ScreenModel::update);
}

void ScreenModel::setSize(qreal width, qreal height) {
    _width = width;
    _height = height;
    if (_session.presentations().screen()) {
        layOut();
        update();
    }
}

void ScreenModel::layOut() {
    const Size& size = _session.presentations().screen()->view()->frame().size;
    if (_width > 0 && (size.width != _width || size.height != _height)) {
        // The first pass finds the widths, and the second the heights at them.
        _session.presentations().layOut(Size{.width = _width, .height = _height});
        _session.presentations().layOut(Size{.width = _width, .height = _height});
    }
}

void ScreenModel::touch(const QString& button) {
    // Refused, nothing happens: the button has been disabled since it was drawn.
    static_cast<void>(_session.presentations().touchButton(button.toStdString()));
    _pump.run();
}

void ScreenModel::cancel() {
    touch(QStringLiteral("cancel"));
}

void ScreenModel::update() {
    const auto screen = _session.presentations().screen();
    const bool wasShown = std::exchange(_isShown, screen != nullptr);
    if (screen) {
        layOut();
        const auto description = host::ScreenDescription::of(*screen);
        _title = qString(description.title);
        _hasCancel = description.leftBarButton == Text("cancel");
        _contentHeight = description.contentSize.height;
    }
    _views.show(screen ? screen->view().get() : nullptr);
    Q_EMIT changed();
    // Whoever hears this gives the screen its size, which changes the rest once more.
    if (_isShown != wasShown) {
        Q_EMIT isShownChanged();
    }
}

} // namespace nimbra::window

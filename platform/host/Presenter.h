#pragma once

namespace nimbra {

/// What a pane may ask of the host that shows it. Main queue only.
class Presenter {
public:
    virtual ~Presenter() = default;

    /// Takes away the screen that the pane has presented over itself; nothing when there is none.
    virtual void dismissPresentedController(bool animated) = 0;

    /// Takes away the pane itself and returns to the page that opened it.
    virtual void dismissPane(bool animated) = 0;
};

} // namespace nimbra

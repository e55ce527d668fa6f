#pragma once

#include "platform/values/Text.h"

namespace nimbra {

/// What a pane may ask of the host that shows it. Main queue only.
class Presenter {
public:
    virtual ~Presenter() = default;

    /// Covers the pane with a busy indicator and `message`, or changes the message of the one that
    /// is shown.
    virtual void showActivityInProgress(const Text& message) = 0;
    /// Takes the busy indicator away; nothing when there is none.
    virtual void hideActivityInProgress() = 0;

    /// Draws the row anew that opened the pane, on the page above it.
    virtual void reloadParentSpecifier() = 0;
    /// Draws the rows anew that led to the pane, on every page above it.
    virtual void reloadAllParentSpecifiers() = 0;

    /// Takes away the screen that the pane has presented over itself; nothing when there is none.
    virtual void dismissPresentedController(bool animated) = 0;

    /// Takes away the pane itself and returns to the page that opened it.
    virtual void dismissPane(bool animated) = 0;
};

} // namespace nimbra

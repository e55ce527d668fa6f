#pragma once

#include "platform/host/Specifier.h"

#include <memory>

namespace nimbra {

/// Is told of each change of a controller's list, after the list has changed: what a window turns
/// into model changes and a command line into lines. Main queue, but for `didReload`, which comes
/// on whichever queue builds the list anew.
class SettingsListObserver {
public:
    virtual ~SettingsListObserver() = default;

    /// The changes up to the matching `endUpdates` are to be shown as one animated batch.
    virtual void didBeginUpdates() = 0;
    virtual void didEndUpdates() = 0;

    /// `rows` now stand in the list, in this order, right behind `after`.
    virtual void didInsert(const SpecifierArray& rows, const Specifier& after, bool animated) = 0;
    /// `rows` now stand at the end of the list, in this order.
    virtual void didAppend(const SpecifierArray& rows, bool animated) = 0;
    /// `rows` stood in the list, in this order, and no longer do.
    virtual void didRemove(const SpecifierArray& rows, bool animated) = 0;
    /// `row` is to be drawn again: its value may be another.
    virtual void didReloadRow(const Specifier& row, bool animated) = 0;
    /// The whole list was built anew; `rows` is all of it.
    virtual void didReload(const SpecifierArray& rows) = 0;
};

} // namespace nimbra

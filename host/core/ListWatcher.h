#pragma once

#include "platform/host/SettingsListObserver.h"

#include <functional>
#include <utility>

namespace nimbra::host {

/// Says that rows may have come or gone, and hands each change of the list on. Main queue.
class ListWatcher final : public SettingsListObserver {
public:
    explicit ListWatcher(std::function<void()> rowsChanged)
        : _rowsChanged(std::move(rowsChanged)) {}

    /// Who is told of each change as well, before; null for nobody. Not owned.
    void setNext(SettingsListObserver* next) { _next = next; }

    void didBeginUpdates() override;
    void didEndUpdates() override;
    void didInsert(const SpecifierArray& rows, const Specifier& after, bool animated) override;
    void didAppend(const SpecifierArray& rows, bool animated) override;
    void didRemove(const SpecifierArray& rows, bool animated) override;
    void didReloadRow(const Specifier& row, bool animated) override;
    void didReload(const SpecifierArray& rows) override;

private:
    std::function<void()> _rowsChanged;
    SettingsListObserver* _next = nullptr;
};

} // namespace nimbra::host

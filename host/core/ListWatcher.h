#pragma once

#include "platform/host/SettingsListObserver.h"

#include <array>
#include <functional>
#include <utility>

namespace nimbra::host {

/// Says that rows may have come or gone, after it has handed each change of the list on. Main
/// queue.
class ListWatcher final : public SettingsListObserver {
public:
    explicit ListWatcher(std::function<void()> rowsChanged)
        : _rowsChanged(std::move(rowsChanged)) {}

    /// Who writes each change down, and who is told of it then; null for nobody. Not owned.
    void setTracer(SettingsListObserver* tracer) { _others.front() = tracer; }
    void setNext(SettingsListObserver* next) { _others.back() = next; }

    void didBeginUpdates() override;
    void didEndUpdates() override;
    void didInsert(const SpecifierArray& rows, const Specifier& after, bool animated) override;
    void didAppend(const SpecifierArray& rows, bool animated) override;
    void didRemove(const SpecifierArray& rows, bool animated) override;
    void didReloadRow(const Specifier& row, bool animated) override;
    void didReload(const SpecifierArray& rows) override;

private:
    template <class... Parameters, class... Arguments>
    void tell(void (SettingsListObserver::*change)(Parameters...), const Arguments&... arguments);

    std::function<void()> _rowsChanged;
    std::array<SettingsListObserver*, 2> _others{};
};

} // namespace nimbra::host

#pragma once

#include "platform/host/SettingsListObserver.h"

#include <string_view>

namespace nimbra::host {

class Trace;

/// Traces the changes of a pane's list.
class TableTracer final : public SettingsListObserver {
public:
    /// `trace` is not owned and outlives this one.
    explicit TableTracer(Trace& trace) : _trace(trace) {}

    void didBeginUpdates() override;
    void didEndUpdates() override;
    void didInsert(const SpecifierArray& rows, const Specifier& after, bool animated) override;
    void didAppend(const SpecifierArray& rows, bool animated) override;
    void didRemove(const SpecifierArray& rows, bool animated) override;
    void didReloadRow(const Specifier& row, bool animated) override;
    void didReload(const SpecifierArray& rows) override;

private:
    void write(std::string_view operation, const SpecifierArray& rows, bool animated);

    Trace& _trace;
};

} // namespace nimbra::host

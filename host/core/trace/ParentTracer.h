#pragma once

#include "platform/host/SettingsListObserver.h"

namespace nimbra::host {

class Trace;

/// Traces that the page from which a pane was opened is built anew; its other changes say nothing
/// of the pane.
class ParentTracer final : public SettingsListObserver {
public:
    /// `trace` is not owned and outlives this one.
    explicit ParentTracer(Trace& trace) : _trace(trace) {}

    void didBeginUpdates() override {}
    void didEndUpdates() override {}
    void didInsert(const SpecifierArray& /*rows*/, const Specifier& /*after*/,
                   bool /*animated*/) override {}
    void didAppend(const SpecifierArray& /*rows*/, bool /*animated*/) override {}
    void didRemove(const SpecifierArray& /*rows*/, bool /*animated*/) override {}
    void didReloadRow(const Specifier& /*row*/, bool /*animated*/) override {}
    void didReload(const SpecifierArray& rows) override;

private:
    Trace& _trace;
};

} // namespace nimbra::host

#pragma once

#include "bench/window/Stopwatch.h"
#include "platform/host/SettingsListObserver.h"

namespace nimbra::bench {

/// Notes how long another observer takes for what it is told.
class TimedRows final : public SettingsListObserver {
public:
    /// Does not own `rows`.
    explicit TimedRows(SettingsListObserver& rows) : _rows(rows) {}

    /// In all, until now.
    [[nodiscard]] double milliseconds() const { return _milliseconds; }

    void didBeginUpdates() override {
        time([&] { _rows.didBeginUpdates(); });
    }
    void didEndUpdates() override {
        time([&] { _rows.didEndUpdates(); });
    }
    void didInsert(const SpecifierArray& rows, const Specifier& after, bool animated) override {
        time([&] { _rows.didInsert(rows, after, animated); });
    }
    void didAppend(const SpecifierArray& rows, bool animated) override {
        time([&] { _rows.didAppend(rows, animated); });
    }
    void didRemove(const SpecifierArray& rows, bool animated) override {
        time([&] { _rows.didRemove(rows, animated); });
    }
    void didReloadRow(const Specifier& row, bool animated) override {
        time([&] { _rows.didReloadRow(row, animated); });
    }
    void didReload(const SpecifierArray& rows) override {
        time([&] { _rows.didReload(rows); });
    }

private:
    template <class Work>
    void time(const Work& work) {
        const Stopwatch stopwatch;
        work();
        _milliseconds += stopwatch.milliseconds();
    }

    SettingsListObserver& _rows;
    double _milliseconds = 0;
};

} // namespace nimbra::bench

#pragma once

#include "platform/host/SettingsListObserver.h"

#include <string>
#include <vector>

namespace nimbra::test {

/// The labels of `rows` in order, "-" for a row without one, separated by blanks.
inline std::string labels(const SpecifierArray& rows) {
    std::string line;
    for (const auto& row : rows) {
        line += line.empty() ? "" : " ";
        line += row->label() ? row->label().string() : "-";
    }
    return line;
}

/// Notes in words what changes in a list, in a list that other recorders may share.
class RecordingListObserver final : public SettingsListObserver {
public:
    explicit RecordingListObserver(std::vector<std::string>& calls) : _calls(calls) {}

    void didBeginUpdates() override { _calls.emplace_back("begin"); }
    void didEndUpdates() override { _calls.emplace_back("end"); }
    void didInsert(const SpecifierArray& rows, const Specifier& after, bool animated) override {
        note("insert " + labels(rows) + " after " + after.label().string(), animated);
    }
    void didAppend(const SpecifierArray& rows, bool animated) override {
        note("append " + labels(rows), animated);
    }
    void didRemove(const SpecifierArray& rows, bool animated) override {
        note("remove " + labels(rows), animated);
    }
    void didReloadRow(const Specifier& row, bool animated) override {
        note("reload row " + row.label().string(), animated);
    }
    void didReload(const SpecifierArray& rows) override {
        _calls.push_back("reload " + labels(rows));
    }

private:
    void note(const std::string& change, bool animated) {
        _calls.push_back(animated ? change + ", animated" : change);
    }

    std::vector<std::string>& _calls;
};

} // namespace nimbra::test

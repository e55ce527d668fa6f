#pragma once

#include "platform/host/Presenter.h"

#include <string>
#include <vector>

namespace nimbra::test {

/// Notes in words what the pane asks of its host, in a list that other recorders may share.
class RecordingPresenter final : public Presenter {
public:
    explicit RecordingPresenter(std::vector<std::string>& calls) : _calls(calls) {}

    void showActivityInProgress(const Text& message) override {
        _calls.push_back("busy: " + message.string());
    }
    void hideActivityInProgress() override { _calls.emplace_back("not busy"); }
    void reloadParentSpecifier() override { _calls.emplace_back("reload parent row"); }
    void reloadAllParentSpecifiers() override { _calls.emplace_back("reload all parent rows"); }
    void dismissPresentedController(bool animated) override {
        _calls.emplace_back(animated ? "dismiss presented, animated" : "dismiss presented");
    }
    void dismissPane(bool animated) override {
        _calls.emplace_back(animated ? "dismiss pane, animated" : "dismiss pane");
    }

private:
    std::vector<std::string>& _calls;
};

} // namespace nimbra::test

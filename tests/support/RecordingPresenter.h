#pragma once

#include "platform/host/Presenter.h"

#include <string>
#include <vector>

namespace nimbra::test {

/// Notes in words what the pane asks of its host, in a list that other recorders may share.
class RecordingPresenter final : public Presenter {
public:
    explicit RecordingPresenter(std::vector<std::string>& calls) : _calls(calls) {}

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

#pragma once

#include "platform/host/Controller.h"

#include <memory>
#include <set>

namespace nimbra {

/// The host's first controller, which knows of each page whether it has a task under way that the
/// user waits for. Main queue only.
class SettingsRootController {
public:
    SettingsRootController() = default;
    SettingsRootController(const SettingsRootController&) = delete;
    SettingsRootController& operator=(const SettingsRootController&) = delete;
    virtual ~SettingsRootController() = default;

    [[nodiscard]] bool taskIsRunning(const std::shared_ptr<const Controller>& controller) const {
        return _running.contains(controller);
    }

    /// From here on `controller` has a task; one that has one already has no second.
    virtual void addTask(const std::shared_ptr<const Controller>& controller) {
        _running.insert(controller);
    }

    /// The task of `controller` has ended; nothing where it has none.
    virtual void taskFinished(const std::shared_ptr<const Controller>& controller) {
        _running.erase(controller);
    }

private:
    /// Not kept alive by its task.
    using Held = std::weak_ptr<const Controller>;
    std::set<Held, std::owner_less<>> _running;
};

} // namespace nimbra

#pragma once

#include <memory>

namespace nimbra {

class SettingsRootController;

/// A page, or what holds a page, as the one that it leads to knows it. Main queue only, but for its
/// release.
class Controller {
public:
    Controller() = default;
    Controller(const Controller&) = delete;
    Controller& operator=(const Controller&) = delete;
    virtual ~Controller() = default;

    /// Builds anew the rows from which one came here.
    virtual void reloadSpecifiers() = 0;

    /// What led here, held weakly; null when there is none or it has gone.
    [[nodiscard]] std::shared_ptr<Controller> parentController() const {
        return _parentController.lock();
    }
    void setParentController(const std::shared_ptr<Controller>& parent) {
        _parentController = parent;
    }

    /// The host's own, held weakly; null when there is none or it has gone.
    [[nodiscard]] std::shared_ptr<SettingsRootController> rootController() const {
        return _rootController.lock();
    }
    void setRootController(const std::shared_ptr<SettingsRootController>& root) {
        _rootController = root;
    }

private:
    std::weak_ptr<Controller> _parentController;
    std::weak_ptr<SettingsRootController> _rootController;
};

} // namespace nimbra

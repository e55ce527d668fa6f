#include "host/core/trace/TracingRootController.h"

#include "host/core/trace/Trace.h"

namespace nimbra::host {

void TracingRootController::addTask(const std::shared_ptr<const Controller>& controller) {
    _trace.write("task", {{"op", "add"}});
    SettingsRootController::addTask(controller);
}

void TracingRootController::taskFinished(const std::shared_ptr<const Controller>& controller) {
    _trace.write("task", {{"op", "finished"}});
    SettingsRootController::taskFinished(controller);
}

} // namespace nimbra::host

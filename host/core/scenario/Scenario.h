#pragma once

#include "device/DeviceDescription.h"
#include "device/documents/ProgressValues.h"
#include "host/core/AccountPage.h"
#include "platform/host/ShareSheet.h"
#include "platform/system/NotificationCenter.h"
#include "platform/views/Geometry.h"

#include <chrono>
#include <string>
#include <variant>
#include <vector>

namespace nimbra::host {

/// A row by the name that the scenario gives it.
struct RowArgument {
    std::string row;
};

struct SetArguments {
    std::string row;
    bool value = false;
};

struct PostArguments {
    Notification notification;
    /// Posted to every process of the device instead of to this one.
    bool distributed = false;
    /// Posted on a thread of its own instead of the main one.
    bool fromOtherThread = false;
};

/// A progress by the name that the scenario gives it.
struct ProgressArguments {
    std::string id;
    /// The values given, in the order in which they stand in the step.
    device::ProgressChanges changes;
};

struct MoveFooterArguments {
    /// Into a window, or out of the one that the footer is in.
    bool window = false;
};

struct AdvanceArguments {
    std::chrono::nanoseconds duration{0};
};

/// A size for the presented screen.
struct LayoutArguments {
    Size size;
};

/// A button or an answer by its title.
struct TitleArgument {
    std::string title;
};

struct ShareArguments {
    ShareOutcome outcome = ShareOutcome::cancelled;
};

struct ChangeArguments {
    device::GivenDescription device;
};

/// One step: what it does, and what of its arguments this version uses.
struct ScenarioStep {
    /// The word under `do`.
    std::string name;
    std::variant<std::monostate, RowArgument, SetArguments, PostArguments, ProgressArguments,
                 MoveFooterArguments, AdvanceArguments, LayoutArguments, TitleArgument,
                 ShareArguments, ChangeArguments>
        arguments;
};

/// A device, how the pane is opened on it, and what is done with it, step by step.
struct Scenario {
    device::GivenDescription device;
    PaneEntry entry;
    std::vector<ScenarioStep> steps;
};

} // namespace nimbra::host

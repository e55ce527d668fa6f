#include "host/core/scenario/StepReader.h"

#include "device/description/DescriptionValues.h"
#include "device/json/JsonReader.h"
#include "platform/system/DistributedNotificationCenter.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <nlohmann/json.hpp>
#include <string>
#include <string_view>
#include <utility>

namespace nimbra::host {

namespace {

using device::JsonReader;
using device::ProgressChanges;
using device::ProgressKey;
using device::ProgressValues;
using Arguments = decltype(ScenarioStep::arguments);

/// A member that has to be there.
JsonReader required(const JsonReader& step, const std::string& key, const std::string& what) {
    JsonReader member = step.member(key);
    if (member.isAbsent()) {
        member.expected(what);
    }
    return member;
}

std::string requiredString(const JsonReader& step, const std::string& key,
                           const std::string& what) {
    return required(step, key, what).string();
}

/// The value under `key`, in whose place null stands for none; a date is a text in a file.
UserInfoValue readUserInfoValue(const UserInfoKey& key, const JsonReader& reader) {
    if (reader.isNull()) {
        return {};
    }
    if (key == MRSyncStatusLastSyncDateKey) {
        return device::readInstant(reader, {});
    }
    const nlohmann::ordered_json& value = reader.value();
    if (value.is_boolean()) {
        return value.get<bool>();
    }
    if (value.is_number_float()) {
        return value.get<double>();
    }
    if (value.is_number()) {
        return reader.integer();
    }
    if (value.is_string()) {
        return Text(value.get<std::string>());
    }
    reader.expected("true, false, a number, a string or null");
    return {};
}

Arguments nothing(const JsonReader& step) {
    step.allowOnly({"do"});
    return {};
}

Arguments row(const JsonReader& step) {
    step.allowOnly({"do", "row"});
    return RowArgument{requiredString(step, "row", "a row's identifier or name")};
}

Arguments set(const JsonReader& step) {
    step.allowOnly({"do", "row", "value"});
    return SetArguments{.row = requiredString(step, "row", "a row's identifier or name"),
                        .value = required(step, "value", "true or false").boolean()};
}

Arguments post(const JsonReader& step) {
    step.allowOnly({"do", "name", "userInfo", "distributed", "from"});
    PostArguments arguments{.notification = {.name = NotificationName(requiredString(
                                                 step, "name", "a notification's name"))}};
    const JsonReader given = step.member("userInfo");
    for (const std::string& key : given.keys()) {
        const UserInfoKey name(key);
        arguments.notification.userInfo.emplace(name, readUserInfoValue(name, given.member(key)));
    }
    arguments.distributed = step.member("distributed").boolean();
    if (const JsonReader from = step.member("from"); !from.isAbsent()) {
        arguments.fromOtherThread = device::readOneOf(from, {"main", "other"}) == "other";
    }
    return arguments;
}

Arguments change(const JsonReader& step) {
    step.allowOnly({"do", "device"});
    return ChangeArguments{device::readScenarioDevice(required(step, "device", "an object"))};
}

void readProgressValue(const JsonReader& reader, const std::string& key, ProgressChanges& changes) {
    ProgressValues& values = changes.values;
    const auto text = [&reader] {
        const auto string = reader.stringOrNull();
        return string ? Text(*string) : Text();
    };
    if (key == "fileOperationKind") {
        values.fileOperationKind = text();
        changes.keys.push_back(ProgressKey::fileOperationKind);
    } else if (key == "fraction") {
        values.fraction = reader.number();
        changes.keys.push_back(ProgressKey::fraction);
    } else if (key == "indeterminate") {
        values.indeterminate = reader.boolean();
        changes.keys.push_back(ProgressKey::indeterminate);
    } else if (key == "description") {
        values.description = text();
        changes.keys.push_back(ProgressKey::description);
    } else if (key == "additional") {
        values.additional = text();
        changes.keys.push_back(ProgressKey::additional);
    }
}

Arguments progress(const JsonReader& step) {
    step.allowOnly({"do", "id", "fileOperationKind", "fraction", "indeterminate", "description",
                    "additional"});
    ProgressArguments arguments{.id = requiredString(step, "id", "a progress's id"), .changes = {}};
    for (const std::string& key : step.keys()) {
        readProgressValue(step.member(key), key, arguments.changes);
    }
    return arguments;
}

Arguments unpublishProgress(const JsonReader& step) {
    step.allowOnly({"do", "id"});
    return ProgressArguments{.id = requiredString(step, "id", "a progress's id"), .changes = {}};
}

Arguments moveFooter(const JsonReader& step) {
    step.allowOnly({"do", "window"});
    return MoveFooterArguments{required(step, "window", "true or false").boolean()};
}

Arguments advance(const JsonReader& step) {
    step.allowOnly({"do", "seconds"});
    const JsonReader reader = required(step, "seconds", "a number");
    const double seconds = reader.number();
    // Ten years: a timer that repeats falls due a few million times then.
    constexpr double most = 315'576'000;
    if (seconds < 0 || seconds > most) {
        reader.expected("a number from 0 to 315576000");
        return {};
    }
    return AdvanceArguments{
        std::chrono::round<std::chrono::nanoseconds>(std::chrono::duration<double>(seconds))};
}

double requiredLength(const JsonReader& step, const std::string& key) {
    const JsonReader reader = required(step, key, "a number");
    const double length = reader.number();
    if (length < 0) {
        reader.expected("a number from 0 up");
    }
    return length;
}

Arguments layout(const JsonReader& step) {
    step.allowOnly({"do", "width", "height"});
    return LayoutArguments{
        {.width = requiredLength(step, "width"), .height = requiredLength(step, "height")}};
}

Arguments tapButton(const JsonReader& step) {
    step.allowOnly({"do", "title"});
    return TitleArgument{requiredString(step, "title", "a button's title")};
}

Arguments alert(const JsonReader& step) {
    step.allowOnly({"do", "choose"});
    return TitleArgument{requiredString(step, "choose", "an action's title")};
}

Arguments share(const JsonReader& step) {
    step.allowOnly({"do", "outcome"});
    const std::string outcome =
        device::readOneOf(step.member("outcome"), {"sent", "cancelled", "failed"});
    if (outcome == "sent") {
        return ShareArguments{ShareOutcome::sent};
    }
    return ShareArguments{outcome == "failed" ? ShareOutcome::failed : ShareOutcome::cancelled};
}

struct StepForm {
    std::string_view name;
    Arguments (*read)(const JsonReader& step);
};

constexpr std::array forms{
    StepForm{"open", nothing},
    StepForm{"appear", nothing},
    StepForm{"disappear", nothing},
    StepForm{"becomeActive", nothing},
    StepForm{"list", nothing},
    StepForm{"get", row},
    StepForm{"set", set},
    StepForm{"tap", row},
    StepForm{"pullToRefresh", nothing},
    StepForm{"post", post},
    StepForm{"publishProgress", progress},
    StepForm{"updateProgress", progress},
    StepForm{"unpublishProgress", unpublishProgress},
    StepForm{"footer", nothing},
    StepForm{"moveFooter", moveFooter},
    StepForm{"layout", layout},
    StepForm{"views", nothing},
    StepForm{"tapButton", tapButton},
    StepForm{"alert", alert},
    StepForm{"share", share},
    StepForm{"advance", advance},
    StepForm{"change", change},
    StepForm{"close", nothing},
};

std::string formNames() {
    std::string names;
    for (const StepForm& form : forms) {
        names += (names.empty() ? "" : ", ") + std::string(form.name);
    }
    return names;
}

} // namespace

ScenarioStep readStep(const JsonReader& reader) {
    const JsonReader name = required(reader, "do", "what the step does");
    ScenarioStep step{.name = name.string(), .arguments = {}};
    const auto* const form = std::ranges::find(forms, step.name, &StepForm::name);
    if (form == forms.end()) {
        name.expected("one of " + formNames());
    } else {
        step.arguments = form->read(reader);
    }
    return step;
}

} // namespace nimbra::host

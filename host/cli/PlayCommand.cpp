#include "host/cli/PlayCommand.h"

#include "host/core/scenario/ScenarioSession.h"
#include "host/core/trace/Trace.h"

#include <ostream>

namespace nimbra::cli {

std::expected<void, Failure> play(const PlayOptions& options, std::ostream& out) {
    host::Trace trace([&out](const std::string& line) { out << line << '\n' << std::flush; });
    const auto prepared = host::ScenarioSession::prepare({.file = options.scenario,
                                                          .keep = options.keep,
                                                          .bundle = options.bundle,
                                                          .locale = options.locale,
                                                          .keepsLogToItself = true},
                                                         trace);
    if (!prepared) {
        return std::unexpected(Failure{exitBadInput, prepared.error().description});
    }
    if (const auto played = (*prepared)->player().play(); !played) {
        const host::StepFailure& failure = played.error();
        return std::unexpected(Failure{exitRefused, "step " + std::to_string(failure.index) + " (" +
                                                        failure.name + "): " + failure.reason});
    }
    return {};
}

} // namespace nimbra::cli

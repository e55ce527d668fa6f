// The steps of a scenario that concern what stands over the page: a screen, alerts and a share
// sheet.
#include "host/core/PaneSession.h"
#include "host/core/Presentations.h"
#include "host/core/RowDescription.h"
#include "host/core/ScreenDescription.h"
#include "host/core/scenario/ScenarioPlayer.h"
#include "host/core/trace/Trace.h"

#include <utility>
#include <variant>

namespace nimbra::host {

namespace {

constexpr const char* noScreen = "no screen is presented";

} // namespace

ScenarioPlayer::Outcome ScenarioPlayer::layout(const ScenarioStep& step) {
    if (!_session.presentations().screen()) {
        return std::unexpected(noScreen);
    }
    _session.presentations().layOut(std::get<LayoutArguments>(step.arguments).size);
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::views(const ScenarioStep& /*step*/) {
    const auto shown = _session.presentations().screen();
    if (!shown) {
        return std::unexpected(noScreen);
    }
    const auto screen = ScreenDescription::of(*shown);
    auto views = nlohmann::ordered_json::array();
    for (const ViewDescription& view : screen.views) {
        views.push_back(view.json());
    }
    _trace.write("views",
                 {{"title", jsonOf(screen.title)},
                  {"leftBarButton", jsonOf(screen.leftBarButton)},
                  {"rightBarButton", jsonOf(screen.rightBarButton)},
                  {"contentSize", nlohmann::ordered_json::array(
                                      {screen.contentSize.width, screen.contentSize.height})},
                  {"views", std::move(views)}});
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::tapButton(const ScenarioStep& step) {
    return _session.presentations().touchButton(std::get<TitleArgument>(step.arguments).title);
}

ScenarioPlayer::Outcome ScenarioPlayer::alert(const ScenarioStep& step) {
    return _session.presentations().answerAlert(std::get<TitleArgument>(step.arguments).title);
}

ScenarioPlayer::Outcome ScenarioPlayer::share(const ScenarioStep& step) {
    return _session.presentations().endSharing(std::get<ShareArguments>(step.arguments).outcome);
}

} // namespace nimbra::host

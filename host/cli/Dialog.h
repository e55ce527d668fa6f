#pragma once

#include "host/cli/Failure.h"
#include "host/cli/Terminal.h"
#include "platform/host/ShareSheet.h"

#include <expected>
#include <filesystem>
#include <functional>
#include <iosfwd>
#include <memory>
#include <optional>
#include <string>

namespace nimbra::host {
class PaneSession;
class Presentations;
struct ShownAlert;
} // namespace nimbra::host

namespace nimbra::cli {

/// Gives the user's answer to the question that `prompt` ends with, as typed; nothing where nobody
/// answers.
using Ask = std::function<std::optional<std::string>(const std::string& prompt)>;

/// Asks on `out`, which outlives it, for a line of standard input.
[[nodiscard]] Ask askingStandardInput(std::ostream& out);

/// Leads the user through what a row has opened over the page: shows the screen as text, touches
/// its button, asks what the page asks, and says where the file is that it offers to share. Main
/// queue.
class Dialog {
public:
    /// None is owned; all outlive the dialog. An empty `ask` is a yes to every question.
    Dialog(host::PaneSession& session, std::ostream& out, const Terminal& terminal, Ask ask);

    /// Until nothing stands over the page any more. A failure says what the page said when
    /// something went wrong, or that the user did not want it: then all is as it was.
    [[nodiscard]] std::expected<void, Failure> lead();

private:
    using Outcome = std::expected<void, Failure>;

    [[nodiscard]] Outcome goThroughScreen();
    [[nodiscard]] Outcome goThroughSharing();
    [[nodiscard]] std::expected<ShareOutcome, std::string> share(const std::filesystem::path& file,
                                                                 const ShareSheet& sheet);
    [[nodiscard]] Outcome answerAlert(const std::shared_ptr<const host::ShownAlert>& alert);
    [[nodiscard]] bool waitForButton();
    void leaveScreen();

    host::PaneSession& _session;
    host::Presentations& _presentations;
    std::ostream& _out;
    Terminal _terminal;
    Ask _ask;
};

} // namespace nimbra::cli

#include "host/cli/Dialog.h"

#include "device/DevicePlatform.h"
#include "device/documents/DeviceFileManager.h"
#include "host/cli/Interruption.h"
#include "host/cli/ScreenText.h"
#include "host/cli/TextLayout.h"
#include "host/cli/Waiting.h"
#include "host/core/PaneSession.h"
#include "host/core/Presentations.h"
#include "host/core/ScreenDescription.h"
#include "host/core/Sharing.h"
#include "platform/views/Button.h"

#include <algorithm>
#include <csignal>
#include <iostream>
#include <termios.h>
#include <unicode/unistr.h>
#include <unistd.h>
#include <utility>

namespace nimbra::cli {

namespace {

std::unexpected<Failure> refused(std::string message) {
    return std::unexpected(Failure{exitRefused, std::move(message)});
}

/// The first answer that looks like this, or else the last one.
std::size_t indexOf(const host::ShownAlert& alert, AlertActionStyle style) {
    const auto action = std::ranges::find(alert.actions, style, &AlertAction::style);
    return std::min(static_cast<std::size_t>(action - alert.actions.begin()),
                    alert.actions.size() - 1);
}

/// The text without the blanks around it, and without the difference between large and small
/// letters.
icu::UnicodeString folded(const std::string& text) {
    return icu::UnicodeString::fromUTF8(text).trim().foldCase();
}

std::string trimmed(const std::string& text) {
    std::string blankless;
    icu::UnicodeString::fromUTF8(text).trim().toUTF8String(blankless);
    return blankless;
}

bool isYes(const std::optional<std::string>& answer, const Text& title) {
    if (!answer) {
        return false;
    }
    const icu::UnicodeString typed = folded(*answer);
    return typed == u"y" || typed == u"yes" || typed == folded(title.string());
}

} // namespace

Ask askingStandardInput(std::ostream& out) {
    return [&out](const std::string& prompt) -> std::optional<std::string> {
        // What was typed before the question is no answer to it.
        static_cast<void>(::tcflush(STDIN_FILENO, TCIFLUSH));
        if (!(out << prompt << std::flush)) {
            return std::nullopt;
        }
        std::string answer;
        const bool isAnswered = static_cast<bool>(std::getline(std::cin, answer));
        // At a terminal the answer has ended the line.
        if (!isAnswered || ::isatty(STDIN_FILENO) == 0) {
            out << '\n' << std::flush;
        }
        return isAnswered ? std::optional(answer) : std::nullopt;
    };
}

Dialog::Dialog(host::PaneSession& session, std::ostream& out, const Terminal& terminal, Ask ask)
    : _session(session), _presentations(session.presentations()), _out(out), _terminal(terminal),
      _ask(std::move(ask)) {}

Dialog::Outcome Dialog::lead() {
    Outcome outcome;
    _session.settle();
    while (_presentations.alert() || _presentations.screen() || _presentations.shareSheet()) {
        if (const auto alert = _presentations.alert()) {
            outcome = answerAlert(alert);
        } else if (_presentations.shareSheet()) {
            outcome = goThroughSharing();
        } else if (outcome) {
            outcome = goThroughScreen();
        } else {
            leaveScreen();
        }
        _session.settle();
    }
    return outcome;
}

Dialog::Outcome Dialog::goThroughScreen() {
    if (!waitForButton()) {
        return refused("cancelled; nothing has been changed");
    }
    // Who could not read the warning has not wanted what follows.
    if (!(_out << screenText(host::ScreenDescription::of(*_presentations.screen()), _terminal)
               << std::flush)) {
        return refused("the output cannot be written, so nothing has been changed");
    }
    _presentations.usableButton()->touch();
    _session.settle();
    if (!_presentations.alert() && _presentations.screen()) {
        return refused("the page opened a screen that goes no further here");
    }
    return {};
}

bool Dialog::waitForButton() {
    if (_presentations.usableButton()) {
        return true;
    }
    // Before it is told that it works.
    const Interruption interruption({SIGINT});
    _out << "Waiting for an answer; ^C gives up.\n" << std::flush;
    while (_presentations.screen() && !_presentations.usableButton()) {
        if (!waitForWork(_session)) {
            return false;
        }
        _session.runPending();
    }
    return _presentations.usableButton() != nullptr;
}

Dialog::Outcome Dialog::answerAlert(const std::shared_ptr<const host::ShownAlert>& alert) {
    if (alert->actions.size() == 1) {
        // It only tells something, and a page that is content tells nothing.
        _presentations.answerAlert(std::size_t{0});
        return refused(printable(alert->title.string() + ": " + alert->message.string()));
    }
    const std::size_t yes = indexOf(*alert, AlertActionStyle::standard);
    const std::size_t no = indexOf(*alert, AlertActionStyle::cancel);
    const Text& yesTitle = alert->actions.at(yes).title;
    const Text& noTitle = alert->actions.at(no).title;
    _out << alertText(*alert, _terminal) << std::flush;
    std::optional<std::string> answer = "yes";
    if (_ask) {
        answer = _ask("  " + printable(yesTitle.string()) + " [y], " + printable(noTitle.string()) +
                      " [n]: ");
    }
    // The main queue may have run while the user thought.
    if (_presentations.alert() != alert) {
        return refused("the question has gone; nothing has been changed");
    }
    if (_out && isYes(answer, yesTitle)) {
        _presentations.answerAlert(yes);
        return {};
    }
    _presentations.answerAlert(no);
    return refused(answer ? "cancelled; nothing has been changed"
                          : "nobody answered, so nothing has been changed (--yes answers)");
}

Dialog::Outcome Dialog::goThroughSharing() {
    const auto sheet = _presentations.shareSheet();
    Outcome outcome;
    ShareOutcome ending = ShareOutcome::cancelled;
    for (const FileURL& item : sheet->activityItems()) {
        const auto file = _session.device().fileManager().fileSystemRepresentation(item);
        if (!file) {
            outcome = refused(printable(item.path()) + " has no place on this machine");
            ending = ShareOutcome::failed;
            continue;
        }
        _out << printable(*file) << '\n' << std::flush;
        if (const auto shared = share(*file, *sheet)) {
            ending = *shared;
        } else {
            outcome = refused(printable(shared.error()));
            ending = ShareOutcome::failed;
        }
    }
    // The main queue may have run while the user thought: who waits for this sheet is told of it.
    if (_presentations.shareSheet() == sheet) {
        static_cast<void>(_presentations.endSharing(ending));
    }
    if (_presentations.shareSheet() == sheet) {
        _presentations.dismissLast();
    }
    return outcome;
}

std::expected<ShareOutcome, std::string> Dialog::share(const std::filesystem::path& file,
                                                       const ShareSheet& sheet) {
    if (!_ask) {
        return ShareOutcome::cancelled;
    }
    // The sheet's activities limit the ways of sending; a copy on this machine is none of them.
    const auto& types = sheet.includedActivityTypes();
    const bool mayMail = !types || std::ranges::find(*types, ActivityTypeMail) != types->end();
    const auto mail = mayMail ? host::findMailProgram() : std::nullopt;
    const auto answer = _ask(std::string("  Copy it to which file or folder") +
                             (mail ? ", or m for a mail" : "") + " (nothing leaves it there): ");
    const std::string target = trimmed(answer.value_or(""));
    if (target.empty() || folded(target) == u"n" || folded(target) == u"no") {
        return ShareOutcome::cancelled;
    }
    if (mail && folded(target) == u"m") {
        if (const auto handed = host::handToMail(*mail, file); !handed) {
            return std::unexpected(handed.error());
        }
        return ShareOutcome::sent;
    }
    const auto copied = host::copyFile(file, host::withHome(target));
    if (!copied) {
        return std::unexpected(copied.error());
    }
    _out << "Copied to " << printable(copied->string()) << '\n' << std::flush;
    return ShareOutcome::sent;
}

void Dialog::leaveScreen() {
    const auto left = _presentations.screen();
    if (_presentations.touchButton("cancel")) {
        _session.settle();
    }
    if (_presentations.screen() == left) {
        _presentations.dismissScreen();
    }
}

} // namespace nimbra::cli

#include "host/cli/LineEditor.h"

#include "host/cli/Interruption.h"
#include "host/cli/TextLayout.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <csignal>
#include <cstdio>
#include <cwchar>
#include <histedit.h>
#include <poll.h>
#include <system_error>
#include <termios.h>
#include <unistd.h>
#include <utility>

namespace nimbra::cli {

namespace {

std::string commonStart(const std::vector<std::string>& texts) {
    std::string start = texts.front();
    for (const std::string& text : texts) {
        const auto difference = std::ranges::mismatch(start, text);
        start.erase(difference.in1, start.end());
    }
    // Not in the middle of a character.
    while (!start.empty() && start.size() < texts.front().size() &&
           (static_cast<unsigned char>(texts.front()[start.size()]) & 0xC0U) == 0x80U) {
        start.pop_back();
    }
    return start;
}

} // namespace

/// The editing library: C, with pointers to functions that get their data through the editor.
class LineEditor::Library {
public:
    explicit Library(Configuration configuration)
        : _configuration(std::move(configuration)), _history(::history_init()),
          _editor(::el_init("settingsctl", stdin, stdout, stderr)) {
        ::el_set(_editor, EL_CLIENTDATA, this);
        ::el_set(_editor, EL_PROMPT, prompt);
        ::el_set(_editor, EL_SIGNAL, 1);
        ::el_set(_editor, EL_EDITOR, "emacs");
        ::el_set(_editor, EL_GETCFN, readCharacterFor);
        // The wide form keeps these very texts; the other one would copy them and lose the copies.
        ::el_wset(_editor, EL_ADDFN, L"complete", L"Completes a word", completeFor);
        ::el_set(_editor, EL_BIND, "^I", "complete", nullptr);
        ::el_set(_editor, EL_HIST, ::history, _history);
        constexpr int remembered = 1000;
        ::history(_history, &_event, H_SETSIZE, remembered);
        ::history(_history, &_event, H_SETUNIQUE, 1);
        ::history(_history, &_event, H_LOAD, _configuration.history.c_str());
    }
    Library(const Library&) = delete;
    Library& operator=(const Library&) = delete;
    ~Library() {
        ::el_end(_editor);
        ::history_end(_history);
    }

    std::optional<std::string> readCommand() {
        auto line = readLine(_configuration.prompt);
        if (line) {
            remember(*line);
        }
        return line;
    }

    std::optional<std::string> readAnswer(const std::string& prompt) {
        _isAnswer = true;
        // What was typed before the question is no answer to it.
        ::tcflush(STDIN_FILENO, TCIFLUSH);
        auto line = readLine(prompt);
        _isAnswer = false;
        return line;
    }

private:
    std::optional<std::string> readLine(const std::string& prompt) {
        _prompt = prompt;
        // ^C gives a line up, and does not end the program.
        const Interruption interruption({SIGINT});
        _isInterrupted = false;
        int length = 0;
        // Before the prompt is shown, which the library would do first: what is typed as soon as
        // it is there is for the editor.
        ::el_set(_editor, EL_PREP_TERM, 1);
        const char* read = ::el_gets(_editor, &length);
        if (read == nullptr || length <= 0) {
            std::fputs(_isInterrupted ? "^C\n" : "\n", stdout);
            return _isInterrupted ? std::optional(std::string()) : std::nullopt;
        }
        std::string line(read, static_cast<std::size_t>(length));
        line.erase(line.find_last_not_of("\r\n") + 1);
        return line;
    }

    void remember(const std::string& line) {
        if (line.empty()) {
            return;
        }
        ::history(_history, &_event, H_ENTER, line.c_str());
        std::error_code ignored;
        std::filesystem::create_directories(_configuration.history.parent_path(), ignored);
        ::history(_history, &_event, H_SAVE, _configuration.history.c_str());
    }

    static Library& of(EditLine* editor) {
        void* library = nullptr;
        ::el_get(editor, EL_CLIENTDATA, &library);
        return *static_cast<Library*>(library);
    }

    static char* prompt(EditLine* editor) { return of(editor)._prompt.data(); }

    static int readCharacterFor(EditLine* editor, wchar_t* character) {
        return of(editor).readCharacter(character);
    }

    /// One character for the library: 1, or 0 at the end of the input, or -1.
    int readCharacter(wchar_t* character) {
        std::mbstate_t state{};
        while (true) {
            if (!waitForInput()) {
                return -1;
            }
            char byte = '\0';
            const ssize_t count = ::read(STDIN_FILENO, &byte, 1);
            if (count < 0 && errno == EINTR) {
                continue;
            }
            if (count <= 0) {
                return static_cast<int>(count);
            }
            switch (std::mbrtowc(character, &byte, 1, &state)) {
            case static_cast<std::size_t>(-2):
                continue;
            case static_cast<std::size_t>(-1):
                // Not a character of the user's encoding: dropped.
                state = {};
                continue;
            default:
                return 1;
            }
        }
    }

    /// Waits for the terminal and, meanwhile, shows what happens elsewhere; false on ^C.
    bool waitForInput() {
        std::array descriptors{
            pollfd{.fd = STDIN_FILENO, .events = POLLIN, .revents = 0},
            pollfd{.fd = _configuration.wakeUpDescriptor, .events = POLLIN, .revents = 0},
            pollfd{.fd = Interruption::descriptor(), .events = POLLIN, .revents = 0}};
        auto& [input, wakeUp, interruption] = descriptors;
        while (true) {
            if (::poll(descriptors.data(), descriptors.size(), -1) < 0) {
                continue;
            }
            if (interruption.revents != 0) {
                _isInterrupted = true;
                errno = EINTR;
                return false;
            }
            if (wakeUp.revents != 0) {
                show(_configuration.whenWoken());
            }
            if (input.revents != 0) {
                return true;
            }
        }
    }

    /// Puts `text` in the place of the line, and the line below it.
    void show(const std::string& text) {
        if (!text.empty()) {
            std::fputs(("\r\x1b[K" + text).c_str(), stdout);
            ::el_set(_editor, EL_REFRESH);
        }
    }

    static unsigned char completeFor(EditLine* editor, int /*character*/) {
        return of(editor).complete();
    }

    unsigned char complete() {
        if (_isAnswer) {
            return CC_REFRESH_BEEP;
        }
        const LineInfo* line = ::el_line(_editor);
        const std::string_view before(line->buffer,
                                      static_cast<std::size_t>(line->cursor - line->buffer));
        const Completion completion = _configuration.complete(before);
        if (completion.candidates.empty()) {
            return CC_REFRESH_BEEP;
        }
        const std::string typed(before.substr(before.size() - completion.replaced));
        std::string insertion = commonStart(completion.candidates);
        if (completion.candidates.size() == 1) {
            insertion += ' ';
        } else if (insertion.size() <= typed.size()) {
            showCandidates(completion.candidates);
            return CC_REDISPLAY;
        }
        std::wstring widened(typed.size(), L'\0');
        const std::size_t characters = std::mbstowcs(widened.data(), typed.c_str(), widened.size());
        ::el_deletestr(_editor, static_cast<int>(characters));
        ::el_insertstr(_editor, insertion.c_str());
        return CC_REFRESH;
    }

    static void showCandidates(const std::vector<std::string>& candidates) {
        std::fputs("\n", stdout);
        for (const std::string& candidate : candidates) {
            std::fputs((printable(candidate) + '\n').c_str(), stdout);
        }
    }

    Configuration _configuration;
    /// Of the line that is being read.
    std::string _prompt;
    bool _isAnswer = false;
    bool _isInterrupted = false;
    HistEvent _event{};
    History* _history;
    EditLine* _editor;
};

LineEditor::LineEditor(Configuration configuration)
    : _library(std::make_unique<Library>(std::move(configuration))) {}

LineEditor::~LineEditor() = default;

std::optional<std::string> LineEditor::readLine() {
    return _library->readCommand();
}

std::optional<std::string> LineEditor::readAnswer(const std::string& prompt) {
    return _library->readAnswer(prompt);
}

} // namespace nimbra::cli

#include "host/cli/ScreenText.h"

#include "host/cli/TextLayout.h"
#include "host/core/Presentations.h"
#include "host/core/ScreenDescription.h"

#include <algorithm>
#include <string_view>

namespace nimbra::cli {

namespace {

constexpr std::size_t indent = 2;

/// What stands around a bold stretch.
struct Marks {
    std::string_view start;
    std::string_view end;
};

// Two characters without a width that no text has any use for: a line that is broken between them
// is told apart from one that is not.
constexpr Marks invisible{.start = "\uFFF9", .end = "\uFFFB"};
constexpr Marks asterisks{.start = "*", .end = "*"};
constexpr Marks escapes{.start = "\x1b[1m", .end = "\x1b[0m"};

std::string replacedAll(std::string_view text, std::string_view old, std::string_view replacement) {
    std::string result;
    for (auto place = text.find(old); place != std::string::npos; place = text.find(old)) {
        result.append(text.substr(0, place)).append(replacement);
        text.remove_prefix(place + old.size());
    }
    return result.append(text);
}

std::string withoutInvisible(std::string_view text) {
    return replacedAll(replacedAll(text, invisible.start, ""), invisible.end, "");
}

/// `line` between the marks, but for the blanks around it; as it is where there is nothing else.
std::string marked(const std::string& line, const Marks& marks) {
    const auto first = line.find_first_not_of(' ');
    if (first == std::string::npos) {
        return line;
    }
    const auto behind = line.find_last_not_of(' ') + 1;
    return line.substr(0, first) + std::string(marks.start) + line.substr(first, behind - first) +
           std::string(marks.end) + line.substr(behind);
}

/// The text with marks around each line of its bold runs.
std::string markedText(const AttributedString& text, const Marks& marks) {
    std::string result;
    for (const AttributedString::Run& run : text.runs()) {
        const std::string plain = withoutInvisible(run.text);
        if (run.attributes.FontAttributeName.weight != FontWeight::bold) {
            result += plain;
            continue;
        }
        for (std::size_t start = 0; start <= plain.size();) {
            const auto end = std::min(plain.find('\n', start), plain.size());
            result += marked(plain.substr(start, end - start), marks);
            result += end < plain.size() ? "\n" : "";
            start = end + 1;
        }
    }
    return result;
}

/// `text` in indented lines; what is between the invisible marks is bold.
std::string paragraphs(const std::string& text, const Terminal& terminal) {
    std::string result;
    bool isBold = false;
    for (std::string line : wrapped(text, terminal.width - (2 * indent))) {
        if (isBold) {
            line.insert(0, invisible.start);
        }
        isBold = line.rfind(invisible.start) != std::string::npos &&
                 (line.rfind(invisible.end) == std::string::npos ||
                  line.rfind(invisible.start) > line.rfind(invisible.end));
        if (isBold) {
            line += invisible.end;
        }
        // A break right behind a mark leaves two with nothing between them.
        line = replacedAll(line, std::string(invisible.start) + std::string(invisible.end), "");
        line = replacedAll(line, invisible.start, escapes.start);
        line = replacedAll(line, invisible.end, escapes.end);
        result.append(indent, ' ').append(line).append("\n");
    }
    return result;
}

std::string bold(const std::string& text, const Terminal& terminal) {
    return terminal.isStyled ? marked(text, escapes) : text;
}

bool canBeSeen(const host::ViewDescription& view) {
    return !view.hidden && view.alpha > 0;
}

std::string viewText(const host::ViewDescription& view, const Terminal& terminal) {
    if (!view.text || view.text->string().empty() || !canBeSeen(view)) {
        return {};
    }
    if (view.enabled) {
        return std::string(indent, ' ') + '[' + printable(view.text->string()) + "]\n";
    }
    return paragraphs(view.styledText
                          ? markedText(*view.styledText, terminal.isStyled ? invisible : asterisks)
                          : withoutInvisible(view.text->string()),
                      terminal);
}

} // namespace

std::string screenText(const host::ScreenDescription& screen, const Terminal& terminal) {
    std::string text = bold(printable(screen.title.string()), terminal) + '\n';
    for (const host::ViewDescription& view : screen.views) {
        if (const std::string part = viewText(view, terminal); !part.empty()) {
            text += '\n' + part;
        }
    }
    return text;
}

std::string alertText(const host::ShownAlert& alert, const Terminal& terminal) {
    return '\n' + bold(printable(alert.title.string()), terminal) + '\n' +
           paragraphs(withoutInvisible(alert.message.string()), terminal);
}

} // namespace nimbra::cli

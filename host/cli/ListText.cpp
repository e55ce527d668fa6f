#include "host/cli/ListText.h"

#include "host/cli/TextLayout.h"

#include <algorithm>
#include <iterator>
#include <string_view>

namespace nimbra::cli {

namespace {

using host::RowDescription;
using host::RowKind;

constexpr const char* bold = "\x1b[1m";
constexpr const char* dim = "\x1b[2m";
constexpr std::size_t indent = 2;

std::string shownName(const RowDescription& row) {
    std::string name =
        row.label() ? printable((row.name ? row.name : row.id).string()) : std::string("(no name)");
    if (row.kind == RowKind::button) {
        name = '[' + name + ']';
    }
    return row.enabled ? name : name + " (locked)";
}

std::string shownValue(const RowDescription& row) {
    std::string value = printable(host::displayedValue(row.value));
    if (row.kind == RowKind::link) {
        return value.empty() ? "›" : value + " ›";
    }
    return value;
}

/// The rows of `rows` that are no headings and that `others` has no equal of.
std::vector<RowDescription> rowsMissingIn(const std::vector<RowDescription>& others,
                                          const std::vector<RowDescription>& rows) {
    std::vector<RowDescription> missing;
    std::ranges::copy_if(rows, std::back_inserter(missing), [&](const RowDescription& row) {
        return row.kind != RowKind::group && std::ranges::find(others, row) == others.end();
    });
    return missing;
}

bool hasRowLike(const std::vector<RowDescription>& rows, const RowDescription& row) {
    return std::ranges::any_of(rows, [&](const RowDescription& other) {
        return other.kind == row.kind && other.label() == row.label();
    });
}

} // namespace

std::string ListText::page(const std::string& title,
                           const std::vector<RowDescription>& rows) const {
    std::string text = styled(bold, printable(title)) + '\n';
    const RowDescription* group = nullptr;
    bool startsBlock = true;
    const auto finishGroup = [&] {
        if (group != nullptr && group->footer) {
            text += (startsBlock ? "\n" : "") + footer(*group);
        }
        startsBlock = true;
    };
    for (const RowDescription& row : rows) {
        if (row.kind == RowKind::group) {
            finishGroup();
            group = &row;
            continue;
        }
        text += (startsBlock ? "\n" : "") + std::string(indent, ' ') + rowLine(row) + '\n';
        startsBlock = false;
    }
    finishGroup();
    return text;
}

std::string ListText::changes(const std::vector<RowDescription>& before,
                              const std::vector<RowDescription>& after) const {
    std::string text;
    for (const RowDescription& row : rowsMissingIn(after, before)) {
        if (!hasRowLike(after, row)) {
            text += "- " + shownName(row) + '\n';
        }
    }
    for (const RowDescription& row : rowsMissingIn(before, after)) {
        text += (hasRowLike(before, row) ? "~ " : "+ ") + rowLine(row) + '\n';
    }
    return text;
}

std::string ListText::rowLine(const RowDescription& row) const {
    std::string line = shownName(row);
    const std::string value = shownValue(row);
    if (value.empty()) {
        return line;
    }
    constexpr std::size_t gap = 2;
    const std::size_t used = indent + displayWidth(line) + displayWidth(value);
    line.append(used + gap < _terminal.width ? _terminal.width - used : gap, ' ');
    return line + value;
}

std::string ListText::footer(const RowDescription& group) const {
    const std::string margin(2 * indent, ' ');
    std::string text;
    for (const std::string& line :
         wrapped(group.footer.string(), _terminal.width - (2 * margin.size()))) {
        text += margin + styled(dim, line) + '\n';
    }
    return text;
}

std::string ListText::styled(const char* style, const std::string& text) const {
    return _terminal.isStyled ? style + text + "\x1b[0m" : text;
}

} // namespace nimbra::cli

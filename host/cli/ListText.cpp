#include "host/cli/ListText.h"

#include "host/cli/TextLayout.h"

#include <algorithm>
#include <cstddef>
#include <string_view>
#include <unordered_map>

namespace nimbra::cli {

namespace {

using host::RowDescription;
using host::RowKind;

constexpr const char* bold = "\x1b[1m";
constexpr const char* dim = "\x1b[2m";
constexpr std::size_t indent = 2;

/// What rows of one list are called, so that each can be told from the others.
class ShownNames {
public:
    explicit ShownNames(const std::vector<RowDescription>& rows) {
        for (const RowDescription& row : rows) {
            if (row.kind != RowKind::group && row.name) {
                ++_bearers[row.name.string()];
            }
        }
    }

    [[nodiscard]] std::string of(const RowDescription& row) const {
        std::string name =
            row.label() ? printable((row.name ? row.name : row.id).string()) : "(no name)";
        if (row.name && row.id && isShared(row.name)) {
            name += " (" + printable(row.id.string()) + ')';
        }
        if (row.kind == RowKind::button) {
            name = '[' + name + ']';
        }
        return row.enabled ? name : name + " (locked)";
    }

private:
    [[nodiscard]] bool isShared(const Text& name) const {
        const auto bearers = _bearers.find(name.string());
        return bearers != _bearers.end() && bearers->second > 1;
    }

    std::unordered_map<std::string_view, std::size_t> _bearers;
};

std::string shownValue(const RowDescription& row) {
    std::string value = printable(host::displayedValue(row.value));
    if (row.kind == RowKind::link) {
        return value.empty() ? "›" : value + " ›";
    }
    return value;
}

/// The rows of one list by what they are called, to be looked up quickly: lists can be long.
class RowsByLabel {
public:
    explicit RowsByLabel(const std::vector<RowDescription>& rows) {
        for (const RowDescription& row : rows) {
            _rows[row.label().string()].push_back(&row);
        }
    }

    [[nodiscard]] bool hasEqualOf(const RowDescription& row) const {
        return hasAny(row, [&row](const RowDescription& other) { return other == row; });
    }
    /// Whether there is the row itself, maybe with another value.
    [[nodiscard]] bool hasRowLike(const RowDescription& row) const {
        return hasAny(row, [&row](const RowDescription& other) {
            return other.kind == row.kind && other.label() == row.label();
        });
    }

private:
    template <class IsMeant>
    [[nodiscard]] bool hasAny(const RowDescription& row, IsMeant isMeant) const {
        const auto bearers = _rows.find(row.label().string());
        return bearers != _rows.end() &&
               std::ranges::any_of(bearers->second, [&isMeant](const RowDescription* other) {
                   return isMeant(*other);
               });
    }

    std::unordered_map<std::string_view, std::vector<const RowDescription*>> _rows;
};

} // namespace

std::string ListText::page(const std::string& title,
                           const std::vector<RowDescription>& rows) const {
    const ShownNames names(rows);
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
        text += (startsBlock ? "\n" : "") + std::string(indent, ' ') + rowLine(names.of(row), row) +
                '\n';
        startsBlock = false;
    }
    finishGroup();
    return text;
}

std::string ListText::changes(const std::vector<RowDescription>& before,
                              const std::vector<RowDescription>& after) const {
    const RowsByLabel earlier(before);
    const RowsByLabel now(after);
    const ShownNames earlierNames(before);
    const ShownNames names(after);
    std::string text;
    for (const RowDescription& row : before) {
        if (row.kind != RowKind::group && !now.hasRowLike(row)) {
            text += "- " + earlierNames.of(row) + '\n';
        }
    }
    for (const RowDescription& row : after) {
        if (row.kind != RowKind::group && !earlier.hasEqualOf(row)) {
            text += (earlier.hasRowLike(row) ? "~ " : "+ ") + rowLine(names.of(row), row) + '\n';
        }
    }
    return text;
}

std::string ListText::rowLine(const std::string& name, const RowDescription& row) const {
    std::string line = name;
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

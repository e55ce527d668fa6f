#include "host/cli/PaneCommands.h"

#include "host/cli/StatusText.h"
#include "host/cli/TextLayout.h"
#include "host/core/PaneSession.h"

#include <cstddef>
#include <nlohmann/json.hpp>
#include <ostream>
#include <unordered_map>
#include <utility>

namespace nimbra::cli {

namespace {

using host::RowDescription;
using host::RowKind;

std::unexpected<Failure> refused(const host::RowRefusal& refusal) {
    return std::unexpected(Failure{exitRefused, refusal.explanation});
}

/// Whether `name` is there and is one line of characters that can be typed.
bool isTypeable(const Text& name) {
    return name && !name.string().empty() && printable(name.string()) == name.string();
}

} // namespace

PaneCommands::PaneCommands(host::PaneSession& session, std::ostream& out)
    : _session(session), _out(out), _text(Terminal::ofStandardOutput()), _shown(rows()) {}

PaneCommands::Outcome PaneCommands::list() const {
    std::vector<RowDescription> shown = rows();
    const SpecifierArray& specifiers = _session.rows();
    for (std::size_t index = 0; index < shown.size(); ++index) {
        if (const auto view = _session.footers().footerOf(*specifiers[index])) {
            const std::string status = statusText(host::FooterDescription::of(*view));
            shown[index].footer = status.empty() ? Text() : Text(status);
        }
    }
    _out << _text.page(_session.paneTitle(), shown);
    return {};
}

PaneCommands::Outcome PaneCommands::listAsJson() const {
    auto list = nlohmann::ordered_json::array();
    for (const RowDescription& row : rows()) {
        list.push_back(row.json());
    }
    _out << list.dump(2, ' ', false, nlohmann::ordered_json::error_handler_t::replace) << '\n';
    return {};
}

PaneCommands::Outcome PaneCommands::get(std::string_view row) const {
    const auto found = _session.row(row);
    if (!found) {
        return refused(found.error());
    }
    if (const auto refusal = host::refusalToRead(**found)) {
        return refused(*refusal);
    }
    _out << host::displayedValue((*found)->value()) << '\n';
    return {};
}

PaneCommands::Outcome PaneCommands::set(std::string_view row, std::string_view value) {
    if (value != "on" && value != "off") {
        return std::unexpected(
            Failure{exitBadInput, "\"on\" or \"off\" expected, not \"" + std::string(value) + '"'});
    }
    const bool wanted = value == "on";
    if (const auto done = _session.setRow(row, wanted); !done) {
        return refused(done.error());
    }
    // The page itself says nothing of a save that failed: its switch goes back.
    _session.settle();
    if (const auto set = _session.row(row); set && (*set)->value() != RowValue(wanted)) {
        return std::unexpected(Failure{exitRefused, '"' + printable(std::string(row)) +
                                                        "\" is still " +
                                                        host::displayedValue((*set)->value()) +
                                                        ": the change could not be saved"});
    }
    return {};
}

PaneCommands::Outcome PaneCommands::tap(std::string_view row, const Ask& ask) {
    if (const auto found = _session.row(row); found) {
        if (const auto refusal = host::refusalToOpen(**found)) {
            return refused(*refusal);
        }
    }
    if (const auto done = _session.tapRow(row); !done) {
        return refused(done.error());
    }
    showDetail();
    return Dialog(_session, _out, Terminal::ofStandardOutput(), ask).lead();
}

/// Prints the page that a link has opened, and comes back from it: the rows stay the pane's.
void PaneCommands::showDetail() {
    host::DetailPage& detail = _session.detailPage();
    if (const auto page = detail.page()) {
        _session.settle();
        _out << _text.page(detail.title(), RowDescription::of(page->specifiers()));
        detail.leave();
    }
}

std::string PaneCommands::takeChanges() {
    if (!_session.isPaneOpen()) {
        return "The page has closed.\n";
    }
    auto now = rows();
    std::string changes = _text.changes(_shown, now);
    _shown = std::move(now);
    return changes;
}

std::vector<std::string> PaneCommands::rowNames() const {
    const std::vector<RowDescription> all = rows();
    std::unordered_map<std::string_view, std::size_t> bearers;
    for (const RowDescription& row : all) {
        ++bearers[row.name.string()];
        if (row.id != row.name) {
            ++bearers[row.id.string()];
        }
    }
    std::vector<std::string> names;
    for (const RowDescription& row : all) {
        const bool isUnique = isTypeable(row.name) && bearers[row.name.string()] == 1;
        const Text& name = isUnique || !row.id ? row.name : row.id;
        if (row.kind != RowKind::group && isTypeable(name)) {
            names.push_back(name.string());
        }
    }
    return names;
}

std::vector<std::string> PaneCommands::rowIdentifiers() const {
    std::vector<std::string> identifiers;
    for (const auto& row : _session.rows()) {
        if (row->cellType() != GroupCell && isTypeable(row->identifier())) {
            identifiers.push_back(row->identifier().string());
        }
    }
    return identifiers;
}

std::vector<RowDescription> PaneCommands::rows() const {
    return RowDescription::of(_session.rows());
}

} // namespace nimbra::cli

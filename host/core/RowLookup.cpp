#include "host/core/RowLookup.h"

#include "host/core/RowDescription.h"
#include "platform/system/ClassRegistry.h"

#include <algorithm>
#include <utility>
#include <vector>

namespace nimbra::host {

namespace {

using Reason = RowRefusal::Reason;

std::string quoted(std::string_view text) {
    return '"' + std::string(text) + '"';
}

/// The row as people call it.
std::string quoted(const Specifier& row) {
    const Text& name = row.name() ? row.name() : row.identifier();
    return name ? quoted(name.string()) : "the row without a name";
}

std::string joined(const std::vector<std::string>& pieces) {
    std::string list;
    for (const std::string& piece : pieces) {
        list += (list.empty() ? "" : ", ") + piece;
    }
    return list;
}

// More than these would be read by nobody.
constexpr std::size_t mostNamed = 8;

/// The first of `pieces`, each once, and how many more there are.
std::string firstOf(std::vector<std::string> pieces) {
    // In a list sorted by name the same ones stand together.
    pieces.erase(std::ranges::unique(pieces).begin(), pieces.end());
    const std::size_t more = pieces.size() > mostNamed ? pieces.size() - mostNamed : 0;
    pieces.resize(pieces.size() - more);
    return joined(pieces) + (more > 0 ? " and " + std::to_string(more) + " more" : "");
}

/// Whether `part` stands in `text`, whatever the case of the letters of English: who mistypes an
/// identifier or a name mistypes these.
bool contains(std::string_view text, std::string_view part) {
    const auto lower = [](char character) {
        return character >= 'A' && character <= 'Z' ? static_cast<char>(character - 'A' + 'a')
                                                    : character;
    };
    return !std::ranges::search(text, part, {}, lower, lower).empty();
}

std::string withArticle(const Specifier& row) {
    switch (row.cellType()) {
    case GroupCell:
        return "a heading";
    case LinkListCell:
        return "a link";
    case SwitchCell:
        return "a switch";
    case ButtonCell:
        return "a button";
    }
    return "a row";
}

RowRefusal noSuchRow(const SpecifierArray& rows, std::string_view name) {
    std::vector<std::string> known;
    std::vector<std::string> alike;
    for (const auto& row : rows) {
        if (row->cellType() == GroupCell || !row->label()) {
            continue;
        }
        known.push_back(quoted(*row));
        if (contains(row->name().string(), name) || contains(row->identifier().string(), name)) {
            alike.push_back(known.back());
        }
    }
    if (known.empty()) {
        return {Reason::noSuchRow, "no row " + quoted(name) + " (the list has no rows)"};
    }
    const bool isNarrower =
        known.size() > mostNamed && !alike.empty() && alike.size() < known.size();
    return {Reason::noSuchRow, "no row " + quoted(name) +
                                   (isNarrower ? " (rows like it: " + firstOf(std::move(alike))
                                               : " (rows: " + firstOf(std::move(known))) +
                                   ')'};
}

RowRefusal ambiguous(const SpecifierArray& matches, std::string_view name) {
    std::vector<std::string> identifiers;
    for (const auto& row : matches) {
        if (row->identifier()) {
            identifiers.push_back(quoted(row->identifier().string()));
        }
    }
    return {Reason::ambiguous,
            quoted(name) + " stands for " + std::to_string(matches.size()) + " rows" +
                (identifiers.empty()
                     ? ", and none has an identifier"
                     : " (name one by its identifier: " + firstOf(std::move(identifiers)) + ')')};
}

RowRefusal notAButton(const Specifier& row) {
    return {Reason::notAButton, quoted(row) + " is " + withArticle(row) + ", not a button"};
}

RowRefusal locked(const Specifier& row) {
    return {Reason::locked, quoted(row) + " is locked"};
}

} // namespace

std::expected<std::shared_ptr<Specifier>, RowRefusal> findRow(const SpecifierArray& rows,
                                                              std::string_view name) {
    const auto rowsWhose = [&](const Text& (Specifier::*text)() const) {
        SpecifierArray matches;
        std::ranges::copy_if(rows, std::back_inserter(matches), [&](const auto& row) {
            const Text& candidate = ((*row).*text)();
            return candidate && candidate.string() == name;
        });
        return matches;
    };
    SpecifierArray matches = rowsWhose(&Specifier::identifier);
    if (matches.empty()) {
        matches = rowsWhose(&Specifier::name);
    }
    if (matches.empty()) {
        return std::unexpected(noSuchRow(rows, name));
    }
    if (matches.size() > 1) {
        return std::unexpected(ambiguous(matches, name));
    }
    return matches.front();
}

RowRefusal refusalOfCoveredPage() {
    return {Reason::covered, "the list is covered by what was opened from it"};
}

std::optional<RowRefusal> refusalToRead(const Specifier& row) {
    if (row.value() != RowValue()) {
        return std::nullopt;
    }
    return RowRefusal{Reason::noValue,
                      quoted(row) + " is " + withArticle(row) + " and has no value"};
}

std::optional<RowRefusal> refusalToTap(const Specifier& row) {
    if (row.cellType() != ButtonCell && row.cellType() != LinkListCell) {
        return notAButton(row);
    }
    if (!row.isEnabled()) {
        return locked(row);
    }
    if (row.cellType() == ButtonCell && !row.hasButtonAction()) {
        return RowRefusal{Reason::noAction, quoted(row) + " does nothing in this version"};
    }
    return std::nullopt;
}

std::optional<RowRefusal> refusalToOpen(const Specifier& row) {
    const ControllerClass* pageClass = row.detailControllerClass();
    if (row.cellType() != LinkListCell || (pageClass != nullptr && pageClass->create)) {
        return std::nullopt;
    }
    return RowRefusal{Reason::noPage,
                      quoted(row) + " leads to a page that this device does not have"};
}

std::expected<void, RowRefusal> turnSwitch(Specifier& row, bool isOn) {
    if (row.cellType() != SwitchCell) {
        return std::unexpected(RowRefusal{
            Reason::notASwitch, quoted(row) + " is " + withArticle(row) + ", not a switch"});
    }
    if (!row.isEnabled()) {
        return std::unexpected(locked(row));
    }
    if (!row.hasSetter()) {
        return std::unexpected(RowRefusal{Reason::noSetter, quoted(row) + " cannot be changed"});
    }
    row.setValue(isOn);
    return {};
}

std::expected<void, RowRefusal> pressButton(Specifier& row) {
    if (row.cellType() != ButtonCell) {
        return std::unexpected(notAButton(row));
    }
    if (auto refusal = refusalToTap(row)) {
        return std::unexpected(std::move(*refusal));
    }
    row.performButtonAction();
    return {};
}

} // namespace nimbra::host

#include "platform/host/SettingsListController.h"

#include "platform/host/Presenter.h"
#include "platform/host/SettingsListObserver.h"

#include <algorithm>
#include <iterator>
#include <unordered_set>
#include <utility>

namespace nimbra {

SettingsListController::SettingsListController(const PlatformServices& services)
    : ViewController(services),
      _table(std::make_shared<Table>(services, Rect(), TableStyle::grouped)) {}

SettingsListController::~SettingsListController() = default;

void SettingsListController::reloadSpecifiers() {
    _specifiers.reset();
    const SpecifierArray& rows = specifiers();
    if (_observer != nullptr) {
        _observer->didReload(rows);
    }
}

void SettingsListController::reloadSpecifierAnimated(const std::shared_ptr<Specifier>& row,
                                                     bool animated) {
    if (indexOfSpecifier(row) && _observer != nullptr) {
        _observer->didReloadRow(*row, animated);
    }
}

void SettingsListController::beginUpdates() {
    if (_updateDepth++ == 0 && _observer != nullptr) {
        _observer->didBeginUpdates();
    }
}

void SettingsListController::endUpdates() {
    if (--_updateDepth == 0 && _observer != nullptr) {
        _observer->didEndUpdates();
    }
}

void SettingsListController::insertSpecifierAfterSpecifierAnimated(
    const std::shared_ptr<Specifier>& row, const std::shared_ptr<Specifier>& after, bool animated) {
    const auto index = indexOfSpecifier(after);
    if (!index) {
        return;
    }
    _specifiers->insert(std::next(_specifiers->begin(), static_cast<std::ptrdiff_t>(*index) + 1),
                        row);
    if (_observer != nullptr) {
        _observer->didInsert({row}, *after, animated);
    }
}

void SettingsListController::addSpecifiersFromArrayAnimated(const SpecifierArray& rows,
                                                            bool animated) {
    if (!_specifiers || rows.empty()) {
        return;
    }
    _specifiers->insert(_specifiers->end(), rows.begin(), rows.end());
    if (_observer != nullptr) {
        _observer->didAppend(rows, animated);
    }
}

void SettingsListController::removeContiguousSpecifiersAnimated(const SpecifierArray& rows,
                                                                bool animated) {
    if (!_specifiers || rows.empty()) {
        return;
    }
    const std::unordered_set<std::shared_ptr<Specifier>> unwanted(rows.begin(), rows.end());
    SpecifierArray removed;
    std::erase_if(*_specifiers, [&](const std::shared_ptr<Specifier>& row) {
        const bool isUnwanted = unwanted.contains(row);
        if (isUnwanted) {
            removed.push_back(row);
        }
        return isUnwanted;
    });
    if (!removed.empty() && _observer != nullptr) {
        _observer->didRemove(removed, animated);
    }
}

void SettingsListController::removeSpecifierAnimated(const std::shared_ptr<Specifier>& row,
                                                     bool animated) {
    removeContiguousSpecifiersAnimated({row}, animated);
}

void SettingsListController::loadView() {
    setView(_table);
}

void SettingsListController::setSpecifier(std::shared_ptr<Specifier> specifier) {
    _specifier = std::move(specifier);
}

void SettingsListController::setTable(std::shared_ptr<Table> table) {
    _table = std::move(table);
}

void SettingsListController::setObserver(SettingsListObserver* observer) {
    _observer = observer;
}

void SettingsListController::reloadParentSpecifier() const {
    services().presenter->reloadParentSpecifier();
}

void SettingsListController::reloadAllParentSpecifiers() const {
    services().presenter->reloadAllParentSpecifiers();
}

std::optional<std::size_t>
SettingsListController::indexOfSpecifier(const std::shared_ptr<Specifier>& row) const {
    if (!_specifiers) {
        return std::nullopt;
    }
    const auto place = std::ranges::find(*_specifiers, row);
    if (place == _specifiers->end()) {
        return std::nullopt;
    }
    return static_cast<std::size_t>(std::distance(_specifiers->begin(), place));
}

std::optional<IndexPath>
SettingsListController::indexPathForSpecifier(const std::shared_ptr<Specifier>& row) const {
    std::optional<IndexPath> found;
    visitRows([&](const IndexPath& path, const std::shared_ptr<Specifier>& candidate) {
        if (candidate == row) {
            found = path;
        }
    });
    return found;
}

std::shared_ptr<Specifier>
SettingsListController::specifierAtIndexPath(const IndexPath& path) const {
    std::shared_ptr<Specifier> found;
    visitRows([&](const IndexPath& candidate, const std::shared_ptr<Specifier>& row) {
        if (candidate == path) {
            found = row;
        }
    });
    return found;
}

template <class Visit>
void SettingsListController::visitRows(const Visit& visit) const {
    if (!_specifiers) {
        return;
    }
    IndexPath next;
    bool isFirst = true;
    for (const std::shared_ptr<Specifier>& row : *_specifiers) {
        if (row->cellType() != GroupCell) {
            visit(next, row);
            ++next.row;
        } else if (!isFirst) {
            next = {.section = next.section + 1, .row = 0};
        }
        isFirst = false;
    }
}

} // namespace nimbra

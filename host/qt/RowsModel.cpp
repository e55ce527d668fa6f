#include "host/qt/RowsModel.h"

#include "host/qt/ApplicationIcons.h"
#include "host/qt/Strings.h"

#include <QThread>
#include <algorithm>
#include <map>
#include <string_view>
#include <unordered_map>
#include <utility>

namespace nimbra::window {

namespace {

/// What makes a row of a new list the same as one of the old list: a key, and how many rows before
/// it have the same.
using Occurrence = std::pair<std::string, std::size_t>;

std::string keyOf(const Specifier& row) {
    const Text application = textValue(row.propertyForKey(LazyIconAppID));
    return std::to_string(static_cast<int>(row.cellType())) + '\n' + row.label().string() + '\n' +
           application.string();
}

template <class Rows, class SpecifierOf>
std::vector<Occurrence> occurrencesIn(const Rows& rows, const SpecifierOf& specifierOf) {
    std::map<std::string, std::size_t> counts;
    std::vector<Occurrence> occurrences;
    occurrences.reserve(rows.size());
    for (const auto& row : rows) {
        std::string key = keyOf(specifierOf(row));
        const std::size_t number = counts[key]++;
        occurrences.emplace_back(std::move(key), number);
    }
    return occurrences;
}

bool isOfApplication(const Specifier& row) {
    return textValue(row.propertyForKey(LazyIconAppID)).isPresent();
}

} // namespace

RowsModel::RowsModel(Actions actions) : _actions(std::move(actions)) {}

int RowsModel::rowCount(const QModelIndex& parent) const {
    return parent.isValid() ? 0 : static_cast<int>(_rows.size());
}

QHash<int, QByteArray> RowsModel::roleNames() const {
    return {{KindRole, "kind"},
            {LabelRole, "label"},
            {TitleRole, "title"},
            {DistinctionRole, "distinction"},
            {ValueRole, "value"},
            {IsOnRole, "isOn"},
            {IsLockedRole, "isLocked"},
            {ApplicationRole, "application"},
            {IconSourceRole, "iconSource"},
            {FooterRole, "footer"},
            {HasStatusRole, "hasStatus"},
            {IsFirstRole, "isFirst"},
            {IsLastRole, "isLast"}};
}

QVariant RowsModel::data(const QModelIndex& index, int role) const {
    if (!index.isValid() || index.row() >= rowCount()) {
        return {};
    }
    const Row& row = _rows.at(static_cast<std::size_t>(index.row()));
    // The page is asked for what a link shows each time it is drawn: other programs change that.
    if (role == ValueRole && !_isFrozen && row.specifier->cellType() == LinkListCell) {
        row.description.reset();
    }
    const host::RowDescription& described = descriptionOf(row);
    switch (role) {
    case KindRole:
        return qString(host::kindName(described.kind));
    case LabelRole:
        return qString(described.label());
    case TitleRole:
        return qString(described.name);
    case DistinctionRole:
        return row.sharesName ? qString(described.id) : QString();
    case ValueRole:
        return qString(host::displayedValue(described.value));
    case IsOnRole:
        return boolValue(described.value);
    case IsLockedRole:
        return !described.enabled;
    case ApplicationRole:
        return qString(described.icon);
    case IconSourceRole:
        return described.icon
                   ? ApplicationIcons::sourceFor(qString(described.icon), qString(described.name))
                   : QUrl();
    case FooterRole:
    case HasStatusRole: {
        const Position group = groupOf(index.row());
        if (group < 0) {
            return role == FooterRole ? QVariant(QString()) : QVariant(false);
        }
        const auto& heading = descriptionOf(_rows.at(static_cast<std::size_t>(group)));
        return role == FooterRole ? QVariant(qString(heading.footer))
                                  : QVariant(heading.footerClass.isPresent());
    }
    default:
        return {};
    }
}

int RowsModel::indexOf(const std::string& label) const {
    const auto named = [&](const auto& textOf) {
        return std::ranges::find_if(_rows, [&](const Row& row) {
            const Text& text = textOf(*row.specifier);
            return text && text.string() == label;
        });
    };
    auto found = named([](const Specifier& row) -> const Text& { return row.identifier(); });
    if (found == _rows.end()) {
        found = named([](const Specifier& row) -> const Text& { return row.name(); });
    }
    return found == _rows.end() ? -1 : static_cast<int>(found - _rows.begin());
}

void RowsModel::readAnew() {
    if (_rows.empty() || _isFrozen) {
        return;
    }
    for (Row& row : _rows) {
        row.description.reset();
    }
    changed(0, std::ssize(_rows) - 1);
}

void RowsModel::drawLinksAnew() {
    for (Position place = 0; place < std::ssize(_rows); ++place) {
        if (_rows[static_cast<std::size_t>(place)].specifier->cellType() == LinkListCell) {
            changed(place, place);
        }
    }
}

void RowsModel::set(int index, bool isOn) {
    if (_isFrozen) {
        return;
    }
    const auto row = _rows.at(static_cast<std::size_t>(index)).specifier;
    // The switch stays as the user has left it until the page says that it is another way, which it
    // may do before the action is over.
    if (auto& description = _rows[static_cast<std::size_t>(index)].description) {
        description->value = isOn;
    }
    const bool isDone = _actions.set(row, isOn);
    if (const Position position = positionOf(*row); position >= 0) {
        if (!isDone) {
            _rows[static_cast<std::size_t>(position)].description.reset();
        }
        changed(position, position);
    }
}

void RowsModel::tap(int index) {
    if (_isFrozen) {
        return;
    }
    const auto row = _rows.at(static_cast<std::size_t>(index)).specifier;
    static_cast<void>(_actions.tap(row));
}

const host::RowDescription& RowsModel::descriptionOf(const Row& row) const {
    if (!row.description) {
        row.description = _isFrozen ? host::RowDescription::withoutValue(*row.specifier)
                                    : host::RowDescription::of(*row.specifier);
    }
    return *row.description;
}

RowsModel::Position RowsModel::positionOf(const Specifier& row) const {
    const auto found = std::ranges::find_if(
        _rows, [&row](const Row& candidate) { return candidate.specifier.get() == &row; });
    return found == _rows.end() ? -1 : found - _rows.begin();
}

RowsModel::Position RowsModel::groupOf(Position position) const {
    while (position >= 0 &&
           _rows[static_cast<std::size_t>(position)].specifier->cellType() != GroupCell) {
        --position;
    }
    return position;
}

void RowsModel::insert(Position position, const SpecifierArray& rows) {
    if (rows.empty()) {
        return;
    }
    const auto first = static_cast<int>(position);
    beginInsertRows({}, first, first + static_cast<int>(rows.size()) - 1);
    std::vector<Row> inserted;
    inserted.reserve(rows.size());
    for (const auto& row : rows) {
        inserted.push_back({.specifier = row, .description = {}});
    }
    _rows.insert(_rows.begin() + position, std::make_move_iterator(inserted.begin()),
                 std::make_move_iterator(inserted.end()));
    endInsertRows();
}

void RowsModel::remove(Position first, Position count) {
    beginRemoveRows({}, static_cast<int>(first), static_cast<int>(first + count - 1));
    _rows.erase(_rows.begin() + first, _rows.begin() + first + count);
    endRemoveRows();
}

void RowsModel::changed(Position first, Position last) {
    Q_EMIT dataChanged(index(static_cast<int>(first)), index(static_cast<int>(last)));
}

void RowsModel::recount() {
    const auto count = static_cast<int>(std::ranges::count_if(
        _rows, [](const Row& row) { return isOfApplication(*row.specifier); }));
    if (std::exchange(_applicationCount, count) != count) {
        Q_EMIT applicationCountChanged();
    }
    recountNames();
}

void RowsModel::recountNames() {
    const auto isCounted = [](const Specifier& row) {
        return row.cellType() != GroupCell && row.name();
    };
    std::unordered_map<std::string_view, std::size_t> bearers;
    bearers.reserve(_rows.size());
    for (const Row& row : _rows) {
        if (isCounted(*row.specifier)) {
            ++bearers[row.specifier->name().string()];
        }
    }
    for (Position place = 0; place < std::ssize(_rows); ++place) {
        Row& row = _rows[static_cast<std::size_t>(place)];
        const bool isShared =
            isCounted(*row.specifier) && bearers[row.specifier->name().string()] > 1;
        if (std::exchange(row.sharesName, isShared) != isShared) {
            const QModelIndex told = index(static_cast<int>(place));
            Q_EMIT dataChanged(told, told, {DistinctionRole});
        }
    }
}

void RowsModel::didInsert(const SpecifierArray& rows, const Specifier& after, bool /*animated*/) {
    const Position position = positionOf(after);
    if (position < 0) {
        // The list was built anew on another thread, and this is not to be heard of before that.
        QMetaObject::invokeMethod(this, &RowsModel::isBehind, Qt::QueuedConnection);
        return;
    }
    insert(position + 1, rows);
    recount();
}

void RowsModel::didAppend(const SpecifierArray& rows, bool /*animated*/) {
    insert(std::ssize(_rows), rows);
    recount();
}

void RowsModel::didRemove(const SpecifierArray& rows, bool /*animated*/) {
    for (auto row = rows.begin(); row != rows.end();) {
        const Position first = positionOf(**row);
        if (first < 0) {
            ++row;
            continue;
        }
        // As many as follow each other here as well go at once.
        Position count = 0;
        while (row != rows.end() && first + count < std::ssize(_rows) &&
               _rows[static_cast<std::size_t>(first + count)].specifier == *row) {
            ++count;
            ++row;
        }
        remove(first, count);
    }
    recount();
}

void RowsModel::didReloadRow(const Specifier& row, bool /*animated*/) {
    if (const Position position = positionOf(row); position >= 0) {
        _rows[static_cast<std::size_t>(position)].description.reset();
        changed(position, position);
    }
}

void RowsModel::didReload(const SpecifierArray& rows) {
    if (QThread::currentThread() == thread()) {
        show(rows);
    } else {
        // On the thread that posts, a notification makes the list anew. The page may have gone, or
        // have yet another list, when this one is heard of.
        QMetaObject::invokeMethod(this, &RowsModel::isBehind, Qt::QueuedConnection);
    }
}

void RowsModel::show(const SpecifierArray& rows) {
    // Rows that go stay frozen until they have gone: their page may be gone by now.
    if (_rows.empty()) {
        _isFrozen = false;
        insert(0, rows);
    } else if (rows.empty()) {
        remove(0, std::ssize(_rows));
        _isFrozen = false;
    } else {
        replaceWhatDiffers(rows);
    }
    recount();
}

void RowsModel::removeAllBut(const std::vector<bool>& staying) {
    for (Position last = std::ssize(staying); last > 0;) {
        const Position end = last;
        while (last > 0 && !staying[static_cast<std::size_t>(last - 1)]) {
            --last;
        }
        if (last < end) {
            remove(last, end - last);
        } else {
            --last;
        }
    }
}

void RowsModel::replaceWhatDiffers(const SpecifierArray& rows) {
    const auto before =
        occurrencesIn(_rows, [](const Row& row) -> const Specifier& { return *row.specifier; });
    const auto after =
        occurrencesIn(rows, [](const auto& row) -> const Specifier& { return *row; });
    std::map<Occurrence, std::size_t> places;
    for (std::size_t place = 0; place < before.size(); ++place) {
        places.emplace(before[place], place);
    }
    // Those of the new list that stood in the old one, in the order of both, stay.
    std::vector<bool> stays(before.size());
    std::vector<bool> stayed(after.size());
    std::size_t next = 0;
    for (std::size_t place = 0; place < after.size(); ++place) {
        const auto known = places.find(after[place]);
        if (known != places.end() && known->second >= next) {
            stays[known->second] = true;
            stayed[place] = true;
            next = known->second + 1;
        }
    }
    removeAllBut(stays);
    // All that are left are of the new list before any of them is asked.
    auto survivor = _rows.begin();
    for (std::size_t place = 0; place < rows.size(); ++place) {
        if (stayed[place]) {
            survivor->specifier = rows[place];
            survivor->description.reset();
            ++survivor;
        }
    }
    _isFrozen = false;
    for (Position place = 0; place < std::ssize(rows); ++place) {
        if (stayed[static_cast<std::size_t>(place)]) {
            continue;
        }
        Position end = place;
        while (end < std::ssize(rows) && !stayed[static_cast<std::size_t>(end)]) {
            ++end;
        }
        insert(place, SpecifierArray(rows.begin() + place, rows.begin() + end));
        place = end - 1;
    }
    changed(0, std::ssize(_rows) - 1);
}

} // namespace nimbra::window

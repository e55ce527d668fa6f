#include "host/qt/ShownRows.h"

#include <utility>

namespace nimbra::window {

namespace {

/// Letters alone, without their marks and capitals: "Écrivain" is found by "ecr".
QString folded(const QString& text) {
    QString letters;
    for (const QChar character : text.normalized(QString::NormalizationForm_KD)) {
        if (character.category() != QChar::Mark_NonSpacing) {
            letters += character;
        }
    }
    return letters.toCaseFolded();
}

} // namespace

ShownRows::ShownRows(RowsModel::Actions actions) : _rows(std::move(actions)) {
    setSourceModel(&_rows);
    connect(this, &QAbstractItemModel::rowsInserted, this, &ShownRows::neighboursChanged);
    connect(this, &QAbstractItemModel::rowsRemoved, this, &ShownRows::neighboursChanged);
    connect(&_rows, &RowsModel::applicationCountChanged, this, [this] {
        Q_EMIT isSearchableChanged();
        if (!isSearchable()) {
            setSearch({});
        }
        updateFruitless();
    });
}

void ShownRows::setSearch(const QString& search) {
    if (std::exchange(_search, search) != search) {
        _folded = folded(search.trimmed());
        invalidateFilter();
        updateFruitless();
        Q_EMIT searchChanged();
    }
}

bool ShownRows::isSearchable() const {
    constexpr int manyApplications = 12;
    return _rows.applicationCount() >= manyApplications;
}

void ShownRows::updateFruitless() {
    bool isFruitless = !_folded.isEmpty();
    for (int row = 0; isFruitless && row < rowCount(); ++row) {
        isFruitless = index(row, 0).data(RowsModel::ApplicationRole).toString().isEmpty();
    }
    if (std::exchange(_isFruitless, isFruitless) != isFruitless) {
        Q_EMIT isFruitlessChanged();
    }
}

bool ShownRows::filterAcceptsRow(int row, const QModelIndex& /*parent*/) const {
    if (_folded.isEmpty()) {
        return true;
    }
    const QModelIndex source = _rows.index(row);
    return source.data(RowsModel::ApplicationRole).toString().isEmpty() ||
           folded(source.data(RowsModel::TitleRole).toString()).contains(_folded);
}

void ShownRows::set(int row, bool isOn) {
    if (const QModelIndex source = mapToSource(index(row, 0)); source.isValid()) {
        _rows.set(source.row(), isOn);
    }
}

void ShownRows::tap(int row) {
    if (const QModelIndex source = mapToSource(index(row, 0)); source.isValid()) {
        _rows.tap(source.row());
    }
}

int ShownRows::indexOf(const QString& label) const {
    const int row = _rows.indexOf(label.toStdString());
    return row < 0 ? -1 : mapFromSource(_rows.index(row)).row();
}

int ShownRows::indexOf(const Specifier& row) const {
    const int place = _rows.indexOf(row);
    return place < 0 ? -1 : mapFromSource(_rows.index(place)).row();
}

QString ShownRows::labelOf(int row) const {
    return index(row, 0).data(RowsModel::LabelRole).toString();
}

bool ShownRows::isRow(int row) const {
    return row >= 0 && row < rowCount() && !isGroup(row);
}

bool ShownRows::isGroup(int row) const {
    const QModelIndex source = mapToSource(index(row, 0));
    return source.data(RowsModel::KindRole).toString() == QLatin1String("group");
}

QVariant ShownRows::data(const QModelIndex& index, int role) const {
    const int row = index.row();
    switch (role) {
    case RowsModel::IsFirstRole:
        return row == 0 || isGroup(row - 1);
    case RowsModel::IsLastRole:
        return row + 1 == rowCount() || isGroup(row + 1);
    default:
        return QSortFilterProxyModel::data(index, role);
    }
}

void ShownRows::neighboursChanged() {
    if (std::exchange(_areEdgesBehind, true)) {
        return;
    }
    // Not before all who look at the rows know of those that have come or gone.
    QMetaObject::invokeMethod(
        this,
        [this] {
            _areEdgesBehind = false;
            if (rowCount() > 0) {
                Q_EMIT dataChanged(index(0, 0), index(rowCount() - 1, 0),
                                   {RowsModel::IsFirstRole, RowsModel::IsLastRole});
            }
            updateFruitless();
        },
        Qt::QueuedConnection);
}

} // namespace nimbra::window

#pragma once

#include "host/qt/RowsModel.h"

#include <QSortFilterProxyModel>
#include <QString>

namespace nimbra::window {

/// The rows of a page that the user sees: all, or of the applications those that are searched for.
/// Tells of each row where in its group's card it stands. Main queue.
class ShownRows final : public QSortFilterProxyModel {
    Q_OBJECT
    /// A piece of the names of the applications that are shown; empty for all.
    Q_PROPERTY(QString search READ search WRITE setSearch NOTIFY searchChanged)
    /// Whether there are so many applications that one wants to search.
    Q_PROPERTY(bool isSearchable READ isSearchable NOTIFY isSearchableChanged)
    /// Whether a search has found nothing.
    Q_PROPERTY(bool isFruitless READ isFruitless NOTIFY isFruitlessChanged)

public:
    explicit ShownRows(RowsModel::Actions actions);

    [[nodiscard]] RowsModel& rows() { return _rows; }

    [[nodiscard]] const QString& search() const { return _search; }
    void setSearch(const QString& search);
    [[nodiscard]] bool isSearchable() const;
    [[nodiscard]] bool isFruitless() const { return _isFruitless; }

    /// Flips the switch of a shown row. Refused, the row is drawn again as it was. Nothing happens
    /// on a row that has gone, which may still be fading out.
    Q_INVOKABLE void set(int row, bool isOn);
    Q_INVOKABLE void tap(int row);
    /// The shown row that a scenario calls `label`; -1 for none.
    Q_INVOKABLE [[nodiscard]] int indexOf(const QString& label) const;
    /// Where `row` stands among those that are shown; -1 where it does not.
    [[nodiscard]] int indexOf(const Specifier& row) const;
    /// What a scenario calls the shown row.
    Q_INVOKABLE [[nodiscard]] QString labelOf(int row) const;
    /// Whether the user can put the focus on the row.
    Q_INVOKABLE [[nodiscard]] bool isRow(int row) const;

    [[nodiscard]] QVariant data(const QModelIndex& index, int role) const override;
    [[nodiscard]] bool filterAcceptsRow(int row, const QModelIndex& parent) const override;

Q_SIGNALS:
    void searchChanged();
    void isSearchableChanged();
    void isFruitlessChanged();

private:
    [[nodiscard]] bool isGroup(int row) const;
    /// Rows have other ones before or behind them.
    void neighboursChanged();
    void updateFruitless();

    RowsModel _rows;
    QString _search;
    /// The search without marks and capitals.
    QString _folded;
    bool _isFruitless = false;
    bool _areEdgesBehind = false;
};

} // namespace nimbra::window

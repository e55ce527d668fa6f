#pragma once

#include "host/core/RowDescription.h"
#include "platform/host/SettingsListObserver.h"

#include <QAbstractListModel>
#include <functional>
#include <memory>
#include <optional>
#include <vector>

namespace nimbra::window {

/// The rows of one page for a view: each change of the page's list is a change of these rows alone,
/// and of a list that is built anew only what differs. A row is asked for its value when the view
/// first wants to know it. Main queue, but that a list may be built anew on any thread.
class RowsModel final : public QAbstractListModel, public SettingsListObserver {
    Q_OBJECT

public:
    enum Role {
        /// "group", "switch", "link" or "button".
        KindRole = Qt::UserRole,
        /// What a scenario calls the row.
        LabelRole,
        TitleRole,
        /// What tells the row from others that have the same title: its identifier; empty where no
        /// other one has.
        DistinctionRole,
        ValueRole,
        IsOnRole,
        IsLockedRole,
        /// The application whose icon stands beside the row; empty for none.
        ApplicationRole,
        /// The source of its icon.
        IconSourceRole,
        /// What stands under the rows of a group; of a row, under those of its own group.
        FooterRole,
        /// Whether the status of the sync stands there.
        HasStatusRole,
        // Where the row stands among those that are shown; see `ShownRows`.
        IsFirstRole,
        IsLastRole,
    };

    /// What the user can do with a row. False where it was refused: all is as before.
    struct Actions {
        std::function<bool(const std::shared_ptr<Specifier>& row, bool isOn)> set;
        std::function<bool(const std::shared_ptr<Specifier>& row)> tap;
    };

    explicit RowsModel(Actions actions);

    /// Shows these rows instead of those before.
    void show(const SpecifierArray& rows);

    /// Their page goes, while they are still seen: nobody is asked for a value any more, and
    /// nothing can be done with them, until others are shown.
    void freeze() { _isFrozen = true; }
    /// Asks for all values once more: something else than the user has set them.
    void readAnew();
    /// Has the link rows drawn once more: what one leads to may have changed what it shows.
    void drawLinksAnew();

    void set(int index, bool isOn);
    void tap(int index);

    /// How many rows stand for applications.
    [[nodiscard]] int applicationCount() const { return _applicationCount; }
    /// Where the row that is called `label` stands; -1 for nowhere.
    [[nodiscard]] int indexOf(const std::string& label) const;
    /// Where `row` stands; -1 for nowhere.
    [[nodiscard]] int indexOf(const Specifier& row) const {
        return static_cast<int>(positionOf(row));
    }

    [[nodiscard]] int rowCount(const QModelIndex& parent = {}) const override;
    [[nodiscard]] QVariant data(const QModelIndex& index, int role) const override;
    [[nodiscard]] QHash<int, QByteArray> roleNames() const override;

    void didBeginUpdates() override {}
    void didEndUpdates() override {}
    void didInsert(const SpecifierArray& rows, const Specifier& after, bool animated) override;
    void didAppend(const SpecifierArray& rows, bool animated) override;
    void didRemove(const SpecifierArray& rows, bool animated) override;
    void didReloadRow(const Specifier& row, bool animated) override;
    void didReload(const SpecifierArray& rows) override;

Q_SIGNALS:
    void applicationCountChanged();
    /// The page has other rows than these: whoever knows it shows them.
    void isBehind();

private:
    struct Row {
        std::shared_ptr<Specifier> specifier;
        /// Of when the view first asked.
        mutable std::optional<host::RowDescription> description;
        /// Whether another row has the same name.
        bool sharesName = false;
    };
    using Position = std::ptrdiff_t;

    [[nodiscard]] const host::RowDescription& descriptionOf(const Row& row) const;
    [[nodiscard]] Position positionOf(const Specifier& row) const;
    /// The position of the group that the row stands in; -1 for none.
    [[nodiscard]] Position groupOf(Position position) const;
    /// Of two lists with rows.
    void replaceWhatDiffers(const SpecifierArray& rows);
    void removeAllBut(const std::vector<bool>& staying);
    void insert(Position position, const SpecifierArray& rows);
    void remove(Position first, Position count);
    void changed(Position first, Position last);
    /// After rows have come or gone.
    void recount();
    void recountNames();

    Actions _actions;
    std::vector<Row> _rows;
    int _applicationCount = 0;
    bool _isFrozen = false;
};

} // namespace nimbra::window

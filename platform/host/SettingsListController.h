#pragma once

#include "platform/host/Specifier.h"
#include "platform/host/ViewController.h"
#include "platform/views/Table.h"

#include <cstddef>
#include <memory>
#include <optional>

namespace nimbra {

class SettingsListObserver;

/// The base of every page that the host draws as a list of rows: it keeps the rows, lets them be
/// changed and tells one observer of each change.
class SettingsListController : public ViewController {
public:
    explicit SettingsListController(const PlatformServices& services);
    ~SettingsListController() override;

    /// The rows in display order, built on the first call and kept until `reloadSpecifiers`.
    [[nodiscard]] virtual const SpecifierArray& specifiers() = 0;

    /// Drops the kept rows and builds them anew. A page that a notification tells to do so does it
    /// on the queue that posts.
    void reloadSpecifiers() override;

    /// Draws `row` again; nothing when it is not in the list.
    void reloadSpecifierAnimated(const std::shared_ptr<Specifier>& row, bool animated);

    /// Brackets changes that are to be shown as one animated batch. Brackets may be nested; the
    /// outermost one counts. Each beginning has its end.
    void beginUpdates();
    void endUpdates();

    /// Puts `row` right behind `after`; nothing when `after` is not in the list.
    void insertSpecifierAfterSpecifierAnimated(const std::shared_ptr<Specifier>& row,
                                               const std::shared_ptr<Specifier>& after,
                                               bool animated);
    /// Puts `rows` at the end of the list; nothing while the list has not been built.
    void addSpecifiersFromArrayAnimated(const SpecifierArray& rows, bool animated);
    /// Takes `rows` out of the list; those that are not in it are nothing to remove.
    void removeContiguousSpecifiersAnimated(const SpecifierArray& rows, bool animated);
    /// Takes `row` out of the list; nothing when it is not in it.
    void removeSpecifierAnimated(const std::shared_ptr<Specifier>& row, bool animated);

    /// A list's view is its table.
    void loadView() override;

    /// The row of the parent page that opened this one; null for the first page.
    [[nodiscard]] const std::shared_ptr<Specifier>& specifier() const { return _specifier; }
    void setSpecifier(std::shared_ptr<Specifier> specifier);

    /// Where the rows are shown; never null.
    [[nodiscard]] const std::shared_ptr<Table>& table() const { return _table; }

    /// Where `row` stands in the table, and which row stands there; nothing for a group's header,
    /// or where there is none. Rows before the first header are a group of their own.
    [[nodiscard]] std::optional<IndexPath>
    indexPathForSpecifier(const std::shared_ptr<Specifier>& row) const;
    [[nodiscard]] std::shared_ptr<Specifier> specifierAtIndexPath(const IndexPath& path) const;

    /// Sets who is told of changes, instead of whoever was; null for nobody. Not owned: to be
    /// taken back before it goes.
    void setObserver(SettingsListObserver* observer);

protected:
    /// Shows the rows in another table, which is not null.
    void setTable(std::shared_ptr<Table> table);

    /// Draws the row anew that opened this page, or the rows on every page above it.
    void reloadParentSpecifier() const;
    void reloadAllParentSpecifiers() const;

    /// Where `row` stands in the list; nothing when it is not in it.
    [[nodiscard]] std::optional<std::size_t>
    indexOfSpecifier(const std::shared_ptr<Specifier>& row) const;

    /// The kept rows; nothing until they are built.
    std::optional<SpecifierArray> _specifiers;

private:
    /// Calls `visit` with the index path of each row that is no group's header, and with the row.
    template <class Visit>
    void visitRows(const Visit& visit) const;

    std::shared_ptr<Table> _table;
    std::shared_ptr<Specifier> _specifier;
    SettingsListObserver* _observer = nullptr;
    int _updateDepth = 0;
};

} // namespace nimbra

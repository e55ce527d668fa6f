#pragma once

#include "platform/PlatformServices.h"
#include "platform/host/Specifier.h"
#include "platform/views/NavigationItem.h"
#include "platform/views/Table.h"

#include <cstddef>
#include <memory>
#include <optional>

namespace nimbra {

class SettingsListObserver;

/// The base of every page that the host draws as a list of rows: it keeps the rows, lets them be
/// changed and tells one observer of each change. To be made as a shared object, over services
/// that outlive it. Main queue only, but for its release, which may happen on any queue.
class SettingsListController : public std::enable_shared_from_this<SettingsListController> {
public:
    explicit SettingsListController(const PlatformServices& services);
    SettingsListController(const SettingsListController&) = delete;
    SettingsListController& operator=(const SettingsListController&) = delete;
    virtual ~SettingsListController();

    /// The rows in display order, built on the first call and kept until `reloadSpecifiers`.
    [[nodiscard]] virtual const SpecifierArray& specifiers() = 0;

    /// Drops the kept rows and builds them anew.
    void reloadSpecifiers();

    /// Draws `row` again; nothing when it is not in the list.
    void reloadSpecifierAnimated(const std::shared_ptr<Specifier>& row, bool animated);

    /// Brackets changes that are to be shown as one animated batch. Brackets may be nested; the
    /// outermost one counts.
    void beginUpdates();
    void endUpdates();

    /// Puts `row` right behind `after`; nothing when `after` is not in the list.
    void insertSpecifierAfterSpecifierAnimated(const std::shared_ptr<Specifier>& row,
                                               const std::shared_ptr<Specifier>& after,
                                               bool animated);
    /// Puts `rows` at the end of the list.
    void addSpecifiersFromArrayAnimated(const SpecifierArray& rows, bool animated);
    /// Takes `rows` out of the list; those that are not in it are nothing to remove.
    void removeContiguousSpecifiersAnimated(const SpecifierArray& rows, bool animated);
    /// Takes `row` out of the list; nothing when it is not in it.
    void removeSpecifierAnimated(const std::shared_ptr<Specifier>& row, bool animated);

    /// The view's life, in this order; the last two may alternate. An override calls its base's
    /// first.
    virtual void viewDidLoad();
    virtual void viewDidAppear(bool animated);
    virtual void viewDidDisappear(bool animated);

    /// The row of the parent page that opened this one; null for the first page.
    [[nodiscard]] const std::shared_ptr<Specifier>& specifier() const { return _specifier; }
    void setSpecifier(std::shared_ptr<Specifier> specifier);

    /// The page that opened this one, held weakly; null when there is none or it has gone.
    [[nodiscard]] std::shared_ptr<SettingsListController> parentController() const;
    void setParentController(const std::shared_ptr<SettingsListController>& parent);

    [[nodiscard]] NavigationItem& navigationItem() { return _navigationItem; }
    [[nodiscard]] Table& table() { return _table; }

    /// Sets who is told of changes, instead of whoever was; null for nobody. Not owned: to be
    /// taken back before it goes.
    void setObserver(SettingsListObserver* observer);

protected:
    [[nodiscard]] const PlatformServices& services() const { return _services; }

    /// Draws the row anew that opened this page, or the rows on every page above it.
    void reloadParentSpecifier() const;
    void reloadAllParentSpecifiers() const;

    /// Takes away the screen presented over this page, or this page itself.
    void dismissViewControllerAnimated(bool animated) const;
    void dismissAnimated(bool animated) const;

    /// Where `row` stands in the list; nothing when it is not in it.
    [[nodiscard]] std::optional<std::size_t>
    indexOfSpecifier(const std::shared_ptr<Specifier>& row) const;

    /// The kept rows; nothing until they are built.
    std::optional<SpecifierArray> _specifiers;

private:
    PlatformServices _services;
    NavigationItem _navigationItem;
    Table _table;
    std::shared_ptr<Specifier> _specifier;
    std::weak_ptr<SettingsListController> _parentController;
    SettingsListObserver* _observer = nullptr;
    int _updateDepth = 0;
};

} // namespace nimbra

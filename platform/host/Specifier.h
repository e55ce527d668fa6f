#pragma once

#include "platform/values/Identifier.h"
#include "platform/values/RowValue.h"
#include "platform/values/UserInfo.h"

#include <functional>
#include <memory>
#include <utility>
#include <vector>

namespace nimbra {

struct ControllerClass;
class SettingsListController;
class Specifier;

using SpecifierArray = std::vector<std::shared_ptr<Specifier>>;

/// How a row looks and behaves; the numbers are the host's.
enum class CellType { GroupCell = 0, LinkListCell = 2, SwitchCell = 6, ButtonCell = 13 };
using enum CellType;

/// Text: what stands under a group's rows.
inline const PropertyKey FooterTextGroupKey{"FooterTextGroupKey"};
/// Text: the class of the view that stands under a group's rows.
inline const PropertyKey FooterCellClassGroupKey{"FooterCellClassGroupKey"};
/// Boolean: false for a row that is shown but cannot be changed. Absent means true.
inline const PropertyKey EnabledKey{"EnabledKey"};
/// Text: the application whose icon stands beside the row; the host fetches it when it is needed.
inline const PropertyKey LazyIconAppID{"LazyIconAppID"};
/// Boolean: whether the host is to fetch an icon for the row.
inline const PropertyKey LazyIconLoading{"LazyIconLoading"};

/// User info, account object: the account that a pane is opened on.
inline const UserInfoKey AccountKey{"AccountKey"};
/// User info, text: the identifier of the account that a pane is opened on.
inline const UserInfoKey AccountIdentifierKey{"AccountIdentifierKey"};
/// User info, boolean: whether a pane is opened inside the account's first setup.
inline const UserInfoKey FirstSetupKey{"firstSetup"};

/// The host's record of one group header or one row. Main queue only.
class Specifier : public std::enable_shared_from_this<Specifier> {
public:
    using Getter = std::function<RowValue(const Specifier& row)>;
    /// A setter and an action may start work that outlasts the call: they are given a hold on the
    /// row.
    using Setter =
        std::function<void(const RowValue& value, const std::shared_ptr<Specifier>& row)>;
    using Action = std::function<void(const std::shared_ptr<Specifier>& row)>;

    struct Row {
        /// The controller whose methods `set` and `get` call; not owned, it outlives the row.
        SettingsListController* target = nullptr;
        /// Empty for a row that cannot be changed.
        Setter set;
        /// Empty for a row without a value.
        Getter get;
        /// The class of the pane that a link row opens; null for none. Owned by its registry.
        const ControllerClass* detail = nullptr;
        CellType cell;
    };

    /// A group header with this identifier and no name.
    [[nodiscard]] static std::shared_ptr<Specifier> groupSpecifierWithID(Text identifier);

    /// A row called `name`, without an identifier.
    [[nodiscard]] static std::shared_ptr<Specifier> preferenceSpecifierNamed(Text name, Row row);

    [[nodiscard]] const Text& identifier() const { return _identifier; }
    void setIdentifier(Text identifier);

    [[nodiscard]] const Text& name() const { return _name; }
    [[nodiscard]] CellType cellType() const { return _row.cell; }
    [[nodiscard]] SettingsListController* target() const { return _row.target; }
    [[nodiscard]] const ControllerClass* detailControllerClass() const { return _row.detail; }

    /// What a person or a scenario calls the row: its identifier, or else its name.
    [[nodiscard]] const Text& label() const;

    /// The value under `key`; nothing where there is none.
    [[nodiscard]] RowValue propertyForKey(const PropertyKey& key) const;
    void setPropertyForKey(RowValue value, const PropertyKey& key);

    /// What travels with the row to the pane that it opens.
    [[nodiscard]] const UserInfo& userInfo() const { return _userInfo; }
    void setUserInfo(UserInfo userInfo);

    /// Whether the row may be changed: false only where `EnabledKey` says so.
    [[nodiscard]] bool isEnabled() const;

    /// Asks the getter; nothing for a row without one.
    [[nodiscard]] RowValue value() const;

    [[nodiscard]] bool hasSetter() const { return static_cast<bool>(_row.set); }
    /// Hands `value` to the setter; nothing happens on a row without one.
    void setValue(const RowValue& value);

    [[nodiscard]] bool hasButtonAction() const { return static_cast<bool>(_buttonAction); }
    /// Sets what a tap on a button row calls.
    void setButtonAction(Action action);
    /// Calls the action; nothing happens on a row without one.
    void performButtonAction();

private:
    Specifier(Text identifier, Text name, Row row);

    Text _identifier;
    Text _name;
    Row _row;
    Action _buttonAction;
    /// A row has few of them, and a list may have many rows.
    std::vector<std::pair<PropertyKey, RowValue>> _properties;
    UserInfo _userInfo;
};

} // namespace nimbra

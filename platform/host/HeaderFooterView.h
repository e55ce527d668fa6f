#pragma once

#include "platform/values/RowValue.h"
#include "platform/views/View.h"

namespace nimbra {

class Table;

/// A view that stands above or under a group's rows, in the place of a text. The host makes it by
/// the name that the group gives, asks it for its height and moves it into its window.
class HeaderFooterView : public View {
public:
    using View::View;

    /// How high the view wants to be in a table of this width. `table` may be null.
    [[nodiscard]] virtual double preferredHeightForWidthInTableView(double width,
                                                                    const Table* table) const = 0;

    /// What the view says of itself under the name `key`, to whoever looks into it from outside;
    /// nothing where it has no such value.
    [[nodiscard]] virtual RowValue valueForKey(const KeyPath& /*key*/) const { return {}; }
};

} // namespace nimbra

#pragma once

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
};

} // namespace nimbra

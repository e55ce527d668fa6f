#pragma once

#include "platform/views/IndexPath.h"
#include "platform/views/RefreshControl.h"
#include "platform/views/TableCell.h"
#include "platform/views/View.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <utility>

namespace nimbra {

/// How a table shows its groups; the numbers are the platform's.
enum class TableStyle : std::uint8_t { plain = 0, grouped = 1 };

/// The table in which the host shows a controller's rows. Main queue only.
class Table final : public View {
public:
    Table(const PlatformServices& services, const Rect& frame, TableStyle style)
        : View(services, frame), _style(style) {}

    [[nodiscard]] TableStyle style() const { return _style; }

    /// The sign of a list that can be pulled down; null where it cannot.
    [[nodiscard]] const std::shared_ptr<RefreshControl>& refreshControl() const {
        return _refreshControl;
    }
    void setRefreshControl(std::shared_ptr<RefreshControl> control) {
        _refreshControl = std::move(control);
    }

    /// Gives the cell of the row at `path` where the host shows that row now, or else null.
    using CellSource = std::function<std::shared_ptr<TableCell>(const IndexPath& path)>;
    /// For the host that draws the table.
    void setCellSource(CellSource source) { _cellSource = std::move(source); }

    /// The cell of the row at `path`; null for a row that is not on the screen.
    [[nodiscard]] std::shared_ptr<TableCell> cellForRowAtIndexPath(const IndexPath& path) const {
        return _cellSource ? _cellSource(path) : nullptr;
    }

private:
    TableStyle _style;
    std::shared_ptr<RefreshControl> _refreshControl;
    CellSource _cellSource;
};

} // namespace nimbra

#pragma once

#include "platform/values/Text.h"
#include "platform/views/View.h"

#include <string>
#include <utility>

namespace nimbra {

/// A row of a table as it stands on the screen. Main queue only.
class TableCell final : public View {
public:
    /// The cell of the row that people call `label`; an absent one for a row without a name.
    TableCell(const PlatformServices& services, const Rect& frame, Text label)
        : View(services, frame), _label(std::move(label)) {}

    [[nodiscard]] const Text& label() const { return _label; }

    /// The cell as logs write it: "<TableCell: LABEL>".
    [[nodiscard]] std::string description() const {
        return "<TableCell: " + (_label ? _label.string() : "(null)") + '>';
    }

private:
    Text _label;
};

} // namespace nimbra

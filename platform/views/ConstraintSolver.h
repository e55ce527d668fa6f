#pragma once

#include "platform/views/Geometry.h"

#include <memory>
#include <string>
#include <vector>

namespace nimbra {

class View;

/// Finds the frames that a view's constraints give its subviews: across first, then, as a text's
/// height follows from its width, down. Rules of a higher priority come before others, a view's own
/// constraints before what the subviews' contents ask for, and both in the order in which they
/// stand. No extent is ever negative.
class ConstraintSolver {
public:
    struct Placement {
        std::shared_ptr<View> view;
        Rect frame;
    };

    /// Solves the constraints of `container` for those subviews that do not stand as they are.
    explicit ConstraintSolver(const View& container);

    /// The frames, in the order of the subviews.
    [[nodiscard]] const std::vector<Placement>& placements() const { return _placements; }

    /// The required rules that cannot hold, in words.
    [[nodiscard]] const std::vector<std::string>& broken() const { return _broken; }

private:
    std::vector<Placement> _placements;
    std::vector<std::string> _broken;
};

} // namespace nimbra

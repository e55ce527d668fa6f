#pragma once

#include "platform/views/Geometry.h"

#include <cmath>
#include <optional>

namespace nimbra {

/// What the device shows its windows on.
struct Screen {
    /// In points.
    Rect bounds;
    /// How many pixels a point has in each direction.
    double scale = 1;

    friend bool operator==(const Screen&, const Screen&) = default;
};

/// `coordinate`, in points, on the nearest edge between pixels of the main screen, the farther one
/// from 0 where two are as near; without a screen a point is a pixel.
[[nodiscard]] inline double RoundToViewScale(double coordinate,
                                             const std::optional<Screen>& mainScreen) {
    const double scale = mainScreen ? mainScreen->scale : 1;
    return std::round(coordinate * scale) / scale;
}

} // namespace nimbra

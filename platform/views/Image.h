#pragma once

#include "platform/values/Text.h"
#include "platform/views/Geometry.h"

namespace nimbra {

/// A picture that a bundle ships.
struct Image {
    Text name;
    /// In points, whatever the number of its pixels.
    Size size;
};

} // namespace nimbra

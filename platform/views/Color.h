#pragma once

#include <cstdint>

namespace nimbra {

/// The colours of the platform; a host chooses their shades.
enum class Color : std::uint8_t { black, gray, white, systemBlue };

} // namespace nimbra

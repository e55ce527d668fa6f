#pragma once

#include <cstdint>

namespace nimbra {

/// What a text is for; the user's settings decide how large that is.
enum class FontTextStyle : std::uint8_t { FontTextStyleBody, FontTextStyleCaption1 };
using enum FontTextStyle;

/// How a text is set. Its measures are the host's to tell (`ViewMetrics`).
struct Font {
    double pointSize = 17;

    friend bool operator==(const Font&, const Font&) = default;
};

} // namespace nimbra

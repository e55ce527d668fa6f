#pragma once

#include <cstdint>

namespace nimbra {

/// What a text is for; the user's settings decide how large that is.
enum class FontTextStyle : std::uint8_t { FontTextStyleBody, FontTextStyleCaption1 };
using enum FontTextStyle;

/// How thick the strokes of a font are.
enum class FontWeight : std::uint8_t { thin, light, regular, bold };

/// How a text is set, in the platform's own typeface. Its measures are the host's to tell
/// (`ViewMetrics`).
struct Font {
    double pointSize = 17;
    FontWeight weight = FontWeight::regular;

    [[nodiscard]] static Font _thinSystemFontOfSize(double pointSize) {
        return {.pointSize = pointSize, .weight = FontWeight::thin};
    }
    [[nodiscard]] static Font _lightSystemFontOfSize(double pointSize) {
        return {.pointSize = pointSize, .weight = FontWeight::light};
    }
    [[nodiscard]] static Font boldSystemFontOfSize(double pointSize) {
        return {.pointSize = pointSize, .weight = FontWeight::bold};
    }

    friend bool operator==(const Font&, const Font&) = default;
};

} // namespace nimbra

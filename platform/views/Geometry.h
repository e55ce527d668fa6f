#pragma once

#include <ostream>

namespace nimbra {

/// A place on the screen, in points.
struct Point {
    double x = 0;
    double y = 0;

    friend bool operator==(const Point&, const Point&) = default;
};

/// An extent, in points.
struct Size {
    double width = 0;
    double height = 0;

    friend bool operator==(const Size&, const Size&) = default;
};

/// A rectangle in the coordinates of the view that it stands in, in points.
struct Rect {
    Point origin;
    Size size;

    friend bool operator==(const Rect&, const Rect&) = default;
};

/// In an intrinsic content size: the content does not care.
inline constexpr double ViewNoIntrinsicMetric = -1;

inline std::ostream& operator<<(std::ostream& out, const Size& size) {
    return out << size.width << 'x' << size.height;
}

inline std::ostream& operator<<(std::ostream& out, const Rect& rect) {
    return out << rect.size << '@' << rect.origin.x << ',' << rect.origin.y;
}

} // namespace nimbra

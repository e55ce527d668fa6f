#pragma once

#include "platform/views/View.h"

#include <cstdint>

namespace nimbra {

/// How a bar looks; the number is the platform's.
enum class ProgressViewStyle : std::uint8_t { standard = 0 };

/// A bar that shows how far something has come.
class ProgressView final : public View {
public:
    ProgressView(const PlatformServices& services, ProgressViewStyle style);

    [[nodiscard]] ProgressViewStyle style() const { return _style; }
    /// From 0 to 1.
    [[nodiscard]] float progress() const { return _progress; }
    /// What lies outside 0 to 1 becomes the nearer of the two, what is no number 0. `animated`:
    /// whether a host moves the bar there instead of drawing it anew.
    void setProgressAnimated(float progress, bool animated);
    /// Whether the last change is to be shown as a movement.
    [[nodiscard]] bool isProgressAnimated() const { return _animated; }

    [[nodiscard]] Size intrinsicContentSize() const override;

private:
    ProgressViewStyle _style;
    float _progress = 0;
    bool _animated = false;
};

} // namespace nimbra

#pragma once

#include "platform/views/View.h"

#include <cstdint>

namespace nimbra {

/// How a spinner looks; the number is the platform's.
enum class ActivityIndicatorViewStyle : std::uint8_t { gray = 2 };

/// A spinner, which shows that something takes its time. A host shows it only while it turns.
class ActivityIndicatorView final : public View {
public:
    /// A spinner at rest, as large as the host's are.
    ActivityIndicatorView(const PlatformServices& services, ActivityIndicatorViewStyle style);

    [[nodiscard]] ActivityIndicatorViewStyle style() const { return _style; }

    void startAnimating() { _animating = true; }
    void stopAnimating() { _animating = false; }
    [[nodiscard]] bool isAnimating() const { return _animating; }

    [[nodiscard]] Size intrinsicContentSize() const override;

private:
    ActivityIndicatorViewStyle _style;
    bool _animating = false;
};

} // namespace nimbra

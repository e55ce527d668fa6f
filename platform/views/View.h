#pragma once

#include "platform/PlatformServices.h"
#include "platform/values/KeyValueObserver.h"
#include "platform/views/Color.h"
#include "platform/views/Geometry.h"
#include "platform/views/LayoutConstraint.h"

#include <array>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace nimbra {

class Window;

/// The two directions of a layout; the numbers are the platform's.
enum class LayoutAxis : std::uint8_t { horizontal = 0, vertical = 1 };

/// How hard a view resists: 1000 means at any price.
using LayoutPriority = float;
inline constexpr LayoutPriority requiredLayoutPriority = 1000;
inline constexpr LayoutPriority highLayoutPriority = 750;
inline constexpr LayoutPriority lowLayoutPriority = 250;

/// A rectangle in the tree of what a host shows. It draws nothing: a host looks at the tree. A view
/// owns its subviews; views are made with `std::make_shared`. Main queue only, but for the release
/// of a view that is in no window, which may happen on any queue.
class View : public KeyValueObserver, public std::enable_shared_from_this<View> {
public:
    /// The services outlive the view.
    View(const PlatformServices& services, const Rect& frame);
    View(const View&) = delete;
    View& operator=(const View&) = delete;
    /// Subviews that somebody else holds are left without a superview and out of the window.
    ~View() override;

    // The tree.

    /// Puts `view` in front of the subviews that are there; it leaves the view that it was in. It
    /// moves into this view's window, or out of its own, and is told before where that is another
    /// one. Asks for a layout. No view, the view itself or one that it stands in is a programming
    /// error that stops the program.
    void addSubview(std::shared_ptr<View> view);
    /// Takes the view, and the constraints that speak of it, out of its superview and the window.
    void removeFromSuperview();
    [[nodiscard]] View* superview() const { return _superview; }
    [[nodiscard]] const std::vector<std::shared_ptr<View>>& subviews() const { return _subviews; }

    // Windows.

    /// The window that the view is shown in; null while it is in none. Not owned.
    [[nodiscard]] Window* window() const { return _window; }
    /// Moves the view, which has no superview, and all below it into `window`, or out of its own
    /// for null: what the host does with the root of a tree. Every view is told before. Also where
    /// `window` is the one that it is in already.
    void moveToWindow(Window* window);
    /// Is told before the view moves to `window` (null: out of its own). Does nothing by default.
    virtual void willMoveToWindow(Window* window);

    // Looks.

    [[nodiscard]] const Rect& frame() const { return _frame; }
    /// A changed size asks for a layout.
    void setFrame(const Rect& frame);
    [[nodiscard]] bool isHidden() const { return _hidden; }
    void setHidden(bool hidden) { _hidden = hidden; }
    /// The opacity, from 0, which cannot be seen, to 1, which hides what is behind.
    [[nodiscard]] double alpha() const { return _alpha; }
    /// Where an animation is being put together, the change becomes a part of it. Stays between 0
    /// and 1.
    void setAlpha(double alpha);
    /// Nothing: what is behind the view shines through.
    [[nodiscard]] std::optional<Color> backgroundColor() const { return _backgroundColor; }
    void setBackgroundColor(Color color) { _backgroundColor = color; }
    /// Whether the view takes touches; it does to begin with.
    [[nodiscard]] bool isUserInteractionEnabled() const { return _takesTouches; }
    void setUserInteractionEnabled(bool enabled) { _takesTouches = enabled; }

    /// What the view is called by those who look into the tree from outside; not shown to the user.
    [[nodiscard]] const std::string& accessibilityIdentifier() const { return _identifier; }
    void setAccessibilityIdentifier(std::string identifier) { _identifier = std::move(identifier); }

    // Layout.

    /// The size that the content needs; `ViewNoIntrinsicMetric` in a direction that does not
    /// matter to it.
    [[nodiscard]] virtual Size intrinsicContentSize() const;
    /// The height of the content where it is `width` wide; by default what it is at any width.
    [[nodiscard]] virtual double heightForWidth(double width) const;

    /// Gives the view the size that its content needs, at the place where it stands; a direction
    /// that does not matter to the content stays as it is.
    void sizeToFit();

    /// Asks for a layout of this view in the next pass.
    void setNeedsLayout() { _needsLayout = true; }
    [[nodiscard]] bool needsLayout() const { return _needsLayout; }
    /// Runs one layout pass: lays out this view and all below it that ask for it, from here down.
    void layoutIfNeeded();
    /// Gives the subviews their frames: by default those that the constraints ask for, where the
    /// subviews do not stand as they are. What nothing is said of has no extent and stands at 0.
    virtual void layoutSubviews();

    /// Whether the view's own frame stands as it is (the default), or constraints give it one.
    [[nodiscard]] bool translatesAutoresizingMaskIntoConstraints() const { return _translates; }
    void setTranslatesAutoresizingMaskIntoConstraints(bool translates) { _translates = translates; }

    /// Adds constraints between this view and its subviews, and asks for a layout. One that speaks
    /// of another view or of both directions at once, or has no finite constant or a priority
    /// outside 0 to 1000, is a programming error that stops the program. Where not all can hold,
    /// those of a lower priority give way, and among equals the later ones; of required ones that
    /// is said in one line to `syslog`.
    void addConstraints(std::vector<LayoutConstraint> constraints);
    [[nodiscard]] const std::vector<LayoutConstraint>& constraints() const { return _constraints; }

    /// How hard the view resists being made smaller than its content; 750 to begin with. Stays
    /// between 0 and 1000.
    [[nodiscard]] LayoutPriority contentCompressionResistancePriorityForAxis(LayoutAxis axis) const;
    void setContentCompressionResistancePriorityForAxis(LayoutPriority priority, LayoutAxis axis);

    /// A plain view observes nothing: a change that reaches it has found no taker, which is said in
    /// one line to `syslog`.
    void observeValueForKeyPath(const KeyPath& keyPath, const Observation& observation) override;

protected:
    [[nodiscard]] const PlatformServices& services() const { return _services; }

private:
    [[nodiscard]] bool isInside(const View& view) const;
    [[nodiscard]] bool canHold(const LayoutConstraint& constraint) const;
    void tellOfMoveTo(Window* window);
    void setWindow(Window* window);
    /// Takes the view out of its superview, if it has one, without a word.
    void leaveSuperview();

    PlatformServices _services;
    Rect _frame;
    View* _superview = nullptr;
    Window* _window = nullptr;
    std::vector<std::shared_ptr<View>> _subviews;
    std::vector<LayoutConstraint> _constraints;
    std::array<LayoutPriority, 2> _compressionResistance{highLayoutPriority, highLayoutPriority};
    std::string _identifier;
    std::optional<Color> _backgroundColor;
    double _alpha = 1;
    bool _hidden = false;
    bool _takesTouches = true;
    bool _needsLayout = true;
    bool _translates = true;
};

} // namespace nimbra

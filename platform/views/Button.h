#pragma once

#include "platform/views/Color.h"
#include "platform/views/ControlTargets.h"
#include "platform/views/Label.h"
#include "platform/views/View.h"

#include <cstdint>
#include <memory>

namespace nimbra {

/// What a button looks like; the number is the platform's.
enum class ButtonType : std::uint8_t { system = 1 };

/// In which state a control looks like this; the number is the platform's.
enum class ControlState : std::uint8_t { normal = 0 };

/// A title that does something when it is touched.
class Button final : public View {
public:
    using Action = ControlTargets<Button>::Action;

    /// A button without a title or a size. The services outlive it.
    [[nodiscard]] static std::shared_ptr<Button> buttonWithType(ButtonType type,
                                                                const PlatformServices& services);

    [[nodiscard]] ButtonType buttonType() const { return _type; }

    /// The title, which stands for every state without one of its own. Another one asks for a
    /// layout.
    void setTitleForState(Text title, ControlState state);
    [[nodiscard]] const Text& titleForState(ControlState state) const;
    /// The label that shows the title; owned by the button and none of its subviews. Its font is
    /// the caller's to set, before the button is laid out; its text is not.
    [[nodiscard]] const std::shared_ptr<Label>& titleLabel() const { return _titleLabel; }

    /// The colour of what can be touched; black where none was set.
    [[nodiscard]] Color tintColor() const { return _tintColor; }
    void setTintColor(Color color) { _tintColor = color; }

    [[nodiscard]] bool isEnabled() const { return _enabled; }
    void setEnabled(bool enabled) { _enabled = enabled; }

    /// Calls `action` on each `event` for as long as `target`, which is held weakly, is alive.
    void addTargetActionForControlEvents(std::weak_ptr<void> target, Action action,
                                         ControlEvent event);

    /// Tells the targets of `touchUpInside`: what the host does when the user has touched the
    /// button and let go. Nothing while it is disabled or takes no touches.
    void touch();

    /// The title with the room that the host's buttons have around it.
    [[nodiscard]] Size intrinsicContentSize() const override;

    /// For `buttonWithType`.
    Button(ButtonType type, const PlatformServices& services);

private:
    ButtonType _type;
    std::shared_ptr<Label> _titleLabel;
    ControlTargets<Button> _targets;
    Color _tintColor = Color::black;
    bool _enabled = true;
};

} // namespace nimbra

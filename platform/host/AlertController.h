#pragma once

#include "platform/values/Text.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <utility>
#include <vector>

namespace nimbra {

/// How an alert looks; the number is the platform's.
enum class AlertControllerStyle : std::uint8_t { alert = 1 };

/// How an answer to an alert looks; the numbers are the platform's.
enum class AlertActionStyle : std::uint8_t { standard = 0, cancel = 1 };

/// One answer to an alert.
struct AlertAction {
    Text title;
    AlertActionStyle style = AlertActionStyle::standard;
    /// What the answer does, after the alert has gone; empty where it only closes the alert.
    std::function<void()> handler;

    [[nodiscard]] static AlertAction actionWithTitleStyleHandler(Text title, AlertActionStyle style,
                                                                 std::function<void()> handler) {
        return {.title = std::move(title), .style = style, .handler = std::move(handler)};
    }
};

/// A question to the user, with the answers that there are. Main queue only.
class AlertController {
public:
    [[nodiscard]] static std::shared_ptr<AlertController>
    alertControllerWithTitleMessagePreferredStyle(Text title, Text message,
                                                  AlertControllerStyle preferredStyle) {
        return std::make_shared<AlertController>(std::move(title), std::move(message),
                                                 preferredStyle);
    }
    /// For the function above.
    AlertController(Text title, Text message, AlertControllerStyle preferredStyle)
        : _title(std::move(title)), _message(std::move(message)), _preferredStyle(preferredStyle) {}

    [[nodiscard]] const Text& title() const { return _title; }
    [[nodiscard]] const Text& message() const { return _message; }
    [[nodiscard]] AlertControllerStyle preferredStyle() const { return _preferredStyle; }

    /// The answers in the order in which they were added.
    [[nodiscard]] const std::vector<AlertAction>& actions() const { return _actions; }
    void addAction(AlertAction action) { _actions.push_back(std::move(action)); }

private:
    Text _title;
    Text _message;
    AlertControllerStyle _preferredStyle;
    std::vector<AlertAction> _actions;
};

} // namespace nimbra

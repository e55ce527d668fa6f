#pragma once

#include "platform/PlatformServices.h"
#include "platform/values/Text.h"

#include <functional>
#include <memory>
#include <utility>

namespace nimbra {

/// Tells the user something about an account, with one button. To be made as a shared object, over
/// services that outlive it. Main queue only.
class AccountAlertView : public std::enable_shared_from_this<AccountAlertView> {
public:
    struct Content {
        Text message;
        Text buttonTitle;
        /// What the button calls, after the alert has gone.
        std::function<void()> action;
    };

    AccountAlertView(const PlatformServices& services, Text title, Content content)
        : _services(services), _title(std::move(title)), _content(std::move(content)) {}

    [[nodiscard]] const Text& title() const { return _title; }
    [[nodiscard]] const Content& content() const { return _content; }

    /// Shows the alert over all else; the host shares it until the user has pressed the button.
    void show();

private:
    PlatformServices _services;
    Text _title;
    Content _content;
};

} // namespace nimbra

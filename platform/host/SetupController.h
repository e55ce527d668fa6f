#pragma once

#include "platform/host/Controller.h"

#include <cstdint>
#include <memory>
#include <utility>

namespace nimbra {

class SettingsListController;

/// How a controller is shown over another one; the numbers are the platform's.
enum class ModalPresentationStyle : std::uint8_t { fullScreen = 0, pageSheet = 1, formSheet = 2 };

/// Holds a page that is presented over another one, with a bar of its own above it. It has no rows:
/// what it is asked to build anew are those of its parent.
class SetupController final : public Controller {
public:
    /// Made as a shared object, it owns its root.
    explicit SetupController(std::shared_ptr<SettingsListController> rootViewController)
        : _rootViewController(std::move(rootViewController)) {}

    [[nodiscard]] const std::shared_ptr<SettingsListController>& rootViewController() const {
        return _rootViewController;
    }

    [[nodiscard]] ModalPresentationStyle modalPresentationStyle() const { return _style; }
    void setModalPresentationStyle(ModalPresentationStyle style) { _style = style; }
    /// Whether the page that it was presented from stays in sight around it.
    [[nodiscard]] bool isSheet() const { return _style != ModalPresentationStyle::fullScreen; }

    void reloadSpecifiers() override {
        if (const auto parent = parentController()) {
            parent->reloadSpecifiers();
        }
    }

private:
    std::shared_ptr<SettingsListController> _rootViewController;
    ModalPresentationStyle _style = ModalPresentationStyle::fullScreen;
};

} // namespace nimbra

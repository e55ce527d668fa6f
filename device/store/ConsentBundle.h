#pragma once

#include "device/DeviceError.h"
#include "platform/system/Bundle.h"

#include <expected>
#include <memory>
#include <optional>
#include <utility>

namespace nimbra::device {

/// An application as a consent record names it: by its identifier, if at all. What belongs to the
/// application beyond that, string tables and images included, stands elsewhere. Any thread.
class ConsentBundle final : public Bundle {
public:
    explicit ConsentBundle(std::optional<BundleIdentifier> identifier)
        : _identifier(std::move(identifier)) {}

    [[nodiscard]] const std::optional<BundleIdentifier>& identifier() const override {
        return _identifier;
    }
    [[nodiscard]] Text localizedStringForKeyValueTable(const Text& /*key*/, const Text& value,
                                                       const Text& /*table*/) const override {
        return value;
    }
    [[nodiscard]] std::shared_ptr<const Image> imageNamed(const Text& /*name*/) const override {
        return nullptr;
    }
    [[nodiscard]] bool isLoaded() const override { return false; }
    std::expected<void, Error> load() override {
        return std::unexpected(deviceError("an application is not loaded by another one"));
    }

private:
    std::optional<BundleIdentifier> _identifier;
};

} // namespace nimbra::device

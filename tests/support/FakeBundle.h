#pragma once

#include "platform/system/Bundle.h"
#include "platform/views/Image.h"

#include <expected>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <utility>

namespace nimbra::test {

/// A bundle with the one string table "Localizable" and the images that a test gives it.
class FakeBundle final : public Bundle {
public:
    /// The pane's bundle.
    explicit FakeBundle(std::map<std::string, Text> texts)
        : FakeBundle(BundleIdentifier("com.vantrel.NimbraDriveSettings"), std::move(texts)) {}
    explicit FakeBundle(std::optional<BundleIdentifier> identifier,
                        std::map<std::string, Text> texts = {})
        : _identifier(std::move(identifier)), _texts(std::move(texts)) {}

    [[nodiscard]] const std::optional<BundleIdentifier>& identifier() const override {
        return _identifier;
    }
    [[nodiscard]] Text localizedStringForKeyValueTable(const Text& key, const Text& value,
                                                       const Text& table) const override {
        const auto entry = _texts.find(key.string());
        return table == Text("Localizable") && entry != _texts.end() ? entry->second : value;
    }
    [[nodiscard]] std::shared_ptr<const Image> imageNamed(const Text& name) const override {
        const auto entry = images.find(name.string());
        return entry != images.end() ? entry->second : nullptr;
    }

    [[nodiscard]] bool isLoaded() const override { return loaded; }
    std::expected<void, Error> load() override {
        ++loads;
        loaded = onLoad();
        return loaded ? std::expected<void, Error>()
                      : std::unexpected(Error{"bundle", 1, "cannot be loaded"});
    }

    std::map<std::string, std::shared_ptr<const Image>> images;
    bool loaded = true;
    /// How often it was to be loaded.
    int loads = 0;
    /// What loading does; false where it fails.
    std::function<bool()> onLoad = [] { return true; };

private:
    std::optional<BundleIdentifier> _identifier;
    std::map<std::string, Text> _texts;
};

} // namespace nimbra::test

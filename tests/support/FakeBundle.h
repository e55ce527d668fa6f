#pragma once

#include "platform/system/Bundle.h"

#include <map>
#include <string>
#include <utility>

namespace nimbra::test {

/// The pane's bundle, with the one string table "Localizable" that a test gives it.
class FakeBundle final : public Bundle {
public:
    explicit FakeBundle(std::map<std::string, Text> texts) : _texts(std::move(texts)) {}

    [[nodiscard]] const BundleIdentifier& identifier() const override { return _identifier; }
    [[nodiscard]] Text localizedStringForKeyValueTable(const Text& key, const Text& value,
                                                       const Text& table) const override {
        const auto entry = _texts.find(key.string());
        return table == Text("Localizable") && entry != _texts.end() ? entry->second : value;
    }

private:
    BundleIdentifier _identifier{"com.vantrel.NimbraDriveSettings"};
    std::map<std::string, Text> _texts;
};

} // namespace nimbra::test

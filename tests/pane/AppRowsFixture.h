#pragma once

#include "tests/pane/PaneFixture.h"

#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

inline const BundleIdentifier kNotes("com.example.notes");
using LogLines = FakeSystemLog::Lines;

/// A page whose rows of applications are its own.
struct AppRowsFixture : PaneFixture {
    AppRowsFixture() {
        pane->apps.reset();
        storeTidewater(true);
    }

    void addRecord(const PrivacyService& service, const char* identifier,
                   std::optional<bool> granted) {
        platform.privacyConsentStore.records[service].push_back(
            {.kPRVInfoBundle = std::make_shared<FakeBundle>(BundleIdentifier(identifier)),
             .kPRVInfoGranted = granted});
    }
    void addNotes(const std::vector<PrivacyService>& services, std::optional<bool> granted) {
        platform.applications.install("com.example.notes", "Notes");
        for (const PrivacyService& service : services) {
            addRecord(service, "com.example.notes", granted);
        }
    }
    [[nodiscard]] std::shared_ptr<Specifier> notes() const {
        for (const auto& row : pane->specifiers()) {
            if (row->identifier() == Text("com.example.notes")) {
                return row;
            }
        }
        return nullptr;
    }
    [[nodiscard]] std::string builtRows() const {
        return labels(pane->_appSpecifiersForPRVServices());
    }
    [[nodiscard]] Calls takeCalls() { return std::exchange(platform.calls, {}); }
    [[nodiscard]] const auto& log() const { return platform.systemLog.lines; }
};

} // namespace nimbra::test

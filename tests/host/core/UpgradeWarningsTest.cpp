#include "device/DeviceDescription.h"
#include "device/DeviceDirectory.h"
#include "device/files/Files.h"
#include "host/core/PaneSession.h"
#include "host/core/Presentations.h"
#include "host/core/ScreenDescription.h"
#include "platform/host/SettingsListController.h"
#include "tests/support/TemporaryDirectory.h"

#include <algorithm>
#include <array>
#include <filesystem>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::host {
namespace {

struct Language {
    const char* tag;
    const char* name;
};

constexpr std::array languages{Language{"en-US", "English"}, Language{"de-DE", "German"},
                               Language{"fr-FR", "French"}, Language{"ja-JP", "Japanese"},
                               Language{"ar-EG", "Arabic"}};

struct Devices {
    const char* heading;
    std::vector<std::string> needUpgrade;
    std::vector<std::string> incompatible;
};

const std::vector<Devices>& everyKind() {
    static const std::vector<Devices> kinds{
        {"no devices", {}, {}},
        {"one that cannot be updated", {}, {"Den"}},
        {"several that cannot be updated", {}, {"Den", "Attic Tablet", "Old Notebook"}},
        {"one to be updated", {"Work Phone"}, {}},
        {"two to be updated", {"Work Phone", "Studio"}, {}},
        {"many to be updated", {"Work Phone", "Studio", "Kitchen", "Travel Tablet"}, {}},
        {"one of each", {"Work Phone"}, {"Den"}},
        {"two to be updated, one that cannot", {"Work Phone", "Studio"}, {"Den"}},
        {"one to be updated, two that cannot", {"Work Phone"}, {"Den", "Attic Tablet"}},
        {"many of each",
         {"Work Phone", "Studio", "Kitchen"},
         {"Den", "Attic Tablet", "Old Notebook"}},
    };
    return kinds;
}

/// The text with asterisks around each line of what is bold.
std::string readable(const AttributedString& text) {
    std::string result;
    for (const AttributedString::Run& run : text.runs()) {
        std::string piece = run.text;
        if (run.attributes.FontAttributeName.weight == FontWeight::bold) {
            const bool endsLine = piece.ends_with('\n');
            piece.resize(piece.size() - (endsLine ? 1 : 0));
            for (auto place = piece.find('\n'); place != std::string::npos;
                 place = piece.find('\n', place + 4)) {
                piece.replace(place, 1, "*\n*");
            }
            piece = '*' + piece + '*' + (endsLine ? "\n" : "");
        }
        result += piece;
    }
    return result;
}

/// A device whose account uses the older storage, with the page open on it.
class OpenDevice {
public:
    explicit OpenDevice(const Language& language) {
        _description.description.locale = language.tag;
        _description.description.accounts.front().usesStratafile = false;
        _description.keys = {"deviceList"};
        EXPECT_TRUE(device::createDeviceDirectory(root(), _description.description));
        auto session = PaneSession::start({.root = root(), .bundle = NIMBRA_PANE_BUNDLE});
        EXPECT_TRUE(session);
        _session = std::move(*session);
        EXPECT_TRUE(_session->openPane({}));
    }

    /// The warning that the upgrade screen shows when the account has these devices.
    std::string warningOf(const Devices& devices) {
        _description.description.deviceList = {.incompatible = devices.incompatible,
                                               .needUpgrade = devices.needUpgrade};
        EXPECT_TRUE(device::changeDeviceDirectory(root(), _description));
        // The row stands first.
        EXPECT_TRUE(_session->tapRow(_session->rows().front()->name().string()));
        _session->settle();
        const auto screen = ScreenDescription::of(*_session->presentations().screen());
        const auto label = std::ranges::find(screen.views, "_warningLabel", &ViewDescription::name);
        EXPECT_TRUE(_session->presentations().touchButton("cancel"));
        return readable(*label->styledText);
    }

private:
    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }

    test::TemporaryDirectory _directory;
    device::GivenDescription _description;
    std::unique_ptr<PaneSession> _session;
};

/// All warnings in all languages, to be read by a person.
std::string allWarnings() {
    std::string text;
    for (const Language& language : languages) {
        OpenDevice device(language);
        text += std::string(text.empty() ? "" : "\n") + "== " + language.name + '\n';
        for (const Devices& devices : everyKind()) {
            std::string warning = device.warningOf(devices);
            warning += warning.ends_with('\n') ? "" : "\n";
            text += "\n-- " + std::string(devices.heading) + "\n" + warning;
        }
    }
    return text;
}

TEST(UpgradeWarnings, ReadAsTheyWereAccepted) {
    const auto accepted = device::readFile(NIMBRA_ACCEPTED_WARNINGS);
    ASSERT_TRUE(accepted) << accepted.error();

    const std::string warnings = allWarnings();

    // Whoever changes a text on purpose reads these, and keeps them in the place of the accepted.
    EXPECT_TRUE(warnings == *accepted) << "the warnings read now:\n" << warnings;
}

} // namespace
} // namespace nimbra::host

#include "tests/house/Command.h"
#include "tests/house/ScratchTree.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace nimbra::test {
namespace {

using testing::HasSubstr;

CommandResult checkLayers(const std::string& root) {
    return run({NIMBRA_SOURCE_DIR "/tools/dev/check-layers", root});
}

/// A small tree in which every layer includes what it may.
class LayerCheck : public testing::Test {
protected:
    void SetUp() override {
        tree.write("platform/Text.h", "#pragma once\n\n#include <string>\n#include <syslog.h>\n");
        tree.write("support/Lookup.h", "#include \"platform/Text.h\"\n");
        tree.write("footer/Footer.h", "#include \"support/Lookup.h\"\n");
        tree.write("upgrade/Upgrade.h", "#include \"support/Lookup.h\"\n");
        tree.write("pane/Pane.h", "#include \"footer/Footer.h\"\n#include \"upgrade/Upgrade.h\"\n");
        tree.write("samples/Sample.cpp", "#include \"platform/Text.h\"\n#include <dlfcn.h>\n");
        tree.write("device/json/Reader.h", "#include <nlohmann/json.hpp>\n");
        tree.write("device/store/Store.h", "#include \"device/json/Reader.h\"\n");
        tree.write("device/bundles/Bundles.h", "#include \"device/json/Reader.h\"\n");
        tree.write("device/DevicePlatform.cpp",
                   "#include \"device/bundles/Bundles.h\"\n#include \"device/store/Store.h\"\n");
        tree.write("host/core/Session.h", "#include \"device/store/Store.h\"\n");
        tree.write("host/cli/Main.cpp",
                   "#include \"host/core/Session.h\"\n#include <CLI/CLI.hpp>\n");
        tree.write("tests/pane/PaneTest.cpp",
                   "#include \"pane/Pane.h\"\n#include <gtest/gtest.h>\n");
        tree.write("build/release/Generated.h", "#include \"no/Place.h\"\n");
    }

    /// Expects the check to fail with a line that begins with `place` and says `why`.
    void expectFault(const std::string& place, const std::string& why) const {
        const CommandResult result = checkLayers(tree.root());
        EXPECT_EQ(result.status, 1);
        EXPECT_THAT(result.output, HasSubstr(place + ": " + why));
    }

    ScratchTree tree;
};

TEST(LayerCheckOfTheProject, TheProjectKeepsItsLayers) {
    const CommandResult result = checkLayers(NIMBRA_SOURCE_DIR);

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, "");
}

TEST_F(LayerCheck, ALineForTheLogStandsWithTheOthers) {
    tree.write("pane/Pane.cpp", "services().systemLog->write(LogLevel::error, \"Oops\");\n");
    expectFault("pane/Pane.cpp:1", "writes a line of its own");
    tree.write("pane/Pane.cpp", "constexpr LogMessage oops{LogLevel::error, \"Oops\"};\n");
    expectFault("pane/Pane.cpp:1", "writes a line of its own");
    tree.write("pane/Pane.cpp", "writeLogMessage(services().systemLog, log_messages::oops);\n");
    EXPECT_EQ(checkLayers(tree.root()).output, "");
}

TEST_F(LayerCheck, ATreeThatKeepsItsLayersPasses) {
    const CommandResult result = checkLayers(tree.root());

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, "");
}

TEST_F(LayerCheck, ThePlatformMayIncludeNothingButItself) {
    tree.write("platform/Text.h", "#pragma once\n#include \"support/Lookup.h\"\n");

    expectFault("platform/Text.h:2",
                R"(includes "support/Lookup.h"; beside itself platform may include nothing else)");
}

TEST_F(LayerCheck, SupportMayNotIncludeThePane) {
    tree.write("support/Lookup.h", "#include \"pane/Pane.h\"\n");

    expectFault("support/Lookup.h:1",
                R"(includes "pane/Pane.h"; beside itself support may include platform)");
}

TEST_F(LayerCheck, TheFooterAndTheUpgradeDoNotKnowEachOther) {
    tree.write("footer/Footer.h", "#include \"upgrade/Upgrade.h\"\n");

    expectFault("footer/Footer.h:1", R"(includes "upgrade/Upgrade.h"; beside itself footer may)");
}

TEST_F(LayerCheck, SamplesStandOverThePlatformAlone) {
    tree.write("samples/Sample.cpp", "#include \"pane/Pane.h\"\n#include <nlohmann/json.hpp>\n");

    expectFault("samples/Sample.cpp:1",
                R"(includes "pane/Pane.h"; beside itself samples may include platform)");
    expectFault("samples/Sample.cpp:2", "includes <nlohmann/json.hpp>");
}

TEST_F(LayerCheck, ThePaneMayNotIncludeTheDevice) {
    tree.write("pane/Pane.h", "  #  include \"device/store/Store.h\"\n");

    expectFault("pane/Pane.h:1", R"(includes "device/store/Store.h"; beside itself pane may)");
}

TEST_F(LayerCheck, TheDeviceMayNotIncludeThePane) {
    tree.write("device/store/Store.h", "#include \"pane/Pane.h\"\n");

    expectFault("device/store/Store.h:1", R"(includes "pane/Pane.h"; beside itself device may)");
}

TEST_F(LayerCheck, TheHostLoadsThePaneAndMayNotIncludeIt) {
    tree.write("host/core/Session.h", "#include \"pane/Pane.h\"\n");

    expectFault("host/core/Session.h:1", R"(includes "pane/Pane.h"; beside itself host/core may)");
}

TEST_F(LayerCheck, TheCoreOfTheHostsMayNotIncludeAHost) {
    tree.write("host/cli/Table.h", "#pragma once\n");
    tree.write("host/core/Session.h", "#include \"host/cli/Table.h\"\n");

    expectFault("host/core/Session.h:1", R"(includes "host/cli/Table.h"; beside itself host/core)");
}

TEST_F(LayerCheck, NothingOfTheProductMayIncludeTests) {
    tree.write("tests/support/Fake.h", "#pragma once\n");
    tree.write("device/store/Store.h", "#include \"tests/support/Fake.h\"\n");

    expectFault("device/store/Store.h:1",
                R"(includes "tests/support/Fake.h"; beside itself device)");
}

TEST_F(LayerCheck, OnlyTheWiringMayIncludeSeveralServices) {
    tree.write("device/store/Store.cpp", "#include \"device/bundles/Bundles.h\"\n");
    tree.write("device/Other.cpp",
               "#include \"device/bundles/Bundles.h\"\n#include \"device/store/Store.h\"\n");

    expectFault("device/store/Store.cpp:1", R"(includes "device/bundles/Bundles.h" beside)");
    expectFault("device/Other.cpp:2", R"(includes "device/store/Store.h" beside device/bundles)");
}

TEST_F(LayerCheck, ALibraryMayStandInItsLayersOnly) {
    tree.write("host/core/Session.h", "#include <SQLiteCpp/SQLiteCpp.h>\n");
    tree.write("host/cli/Main.cpp", "#include <QObject>\n");
    tree.write("device/store/Store.h", "#include <CLI/CLI.hpp>\n");
    tree.write("tools/Tool.cpp", "#include <spdlog/spdlog.h>\n");
    tree.write("host/core/Picture.cpp", "#include <png.h>\n");

    expectFault("host/core/Session.h:1",
                "includes <SQLiteCpp/SQLiteCpp.h>, which may stand in dev");
    expectFault("host/cli/Main.cpp:1", "includes <QObject>, which may stand in host/qt only");
    expectFault("device/store/Store.h:1", "includes <CLI/CLI.hpp>, which may stand in host/cli");
    expectFault("tools/Tool.cpp:1", "includes <spdlog/spdlog.h>, which may stand in device only");
    expectFault("host/core/Picture.cpp:1", "includes <png.h>, which may stand in device only");
}

TEST_F(LayerCheck, ThePanesSideUsesTheStandardLibraryAndPosixOnly) {
    tree.write("pane/Pane.h", "#include <unicode/coll.h>\n");
    tree.write("support/Lookup.h", "#include <zlib.h>\n");

    expectFault("pane/Pane.h:1", "includes <unicode/coll.h>, which may stand in device");
    expectFault("support/Lookup.h:1", "includes <zlib.h>; support may use the standard library");
}

TEST_F(LayerCheck, FilesThatIncludeEachOtherInACircleAreFound) {
    tree.write("platform/A.h", "#include \"platform/B.h\"\n");
    tree.write("platform/B.h", "#include \"platform/C.h\"\n");
    tree.write("platform/C.h", "\n#include \"platform/A.h\"\n");

    const CommandResult result = checkLayers(tree.root());

    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.output, HasSubstr("which closes a circle: platform/"));
}

TEST_F(LayerCheck, AFileOfMoreThanFourHundredLinesIsTooLong) {
    std::string lines;
    for (int line = 0; line < 400; ++line) {
        lines += "// line\n";
    }
    tree.write("pane/Long.cpp", lines);
    ASSERT_EQ(checkLayers(tree.root()).status, 0);

    tree.write("pane/Long.cpp", lines + "// line\n");

    expectFault("pane/Long.cpp:401", "is longer than 400 lines");
}

TEST_F(LayerCheck, HeadersAreNamedFromTheRoot) {
    tree.write("pane/Rows.cpp", "#include \"Pane.h\"\n");

    expectFault("pane/Rows.cpp:1", R"(includes "Pane.h", which is no place of the project)");
}

TEST_F(LayerCheck, AFileOutsideEveryLayerIsFound) {
    tree.write("misc/Helper.h", "#pragma once\n");

    expectFault("misc/Helper.h:1", "is in no layer of the project");
}

} // namespace
} // namespace nimbra::test

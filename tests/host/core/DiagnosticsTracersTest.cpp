#include "platform/host/SettingsRootController.h"
#include "platform/host/ShareSheet.h"
#include "platform/views/TableCell.h"
#include "tests/host/core/TracersFixture.h"

#include <fcntl.h>

namespace nimbra::host {
namespace {

class DiagnosticsTracers : public Tracers {};

TEST_F(DiagnosticsTracers, WhatIsRemovedIsTraced) {
    _platform.fileManager.removeOutcomes = {std::nullopt, Error{"disk", 28, "full"}};

    EXPECT_TRUE(_services.fileManager->removeItemAtPath("/a/"));
    EXPECT_FALSE(_services.fileManager->removeItemAtPath("/a"));

    EXPECT_EQ(takeLines(), (Lines{R"({"event":"file","op":"removeItem","path":"/a/"})",
                                  R"({"event":"file","op":"removeItem","path":"/a",)"
                                  R"("error":{"domain":"disk","code":28,"description":"full"}})"}));
}

TEST_F(DiagnosticsTracers, WhatIsMadeIsTraced) {
    _platform.fileManager.createOutcomes = {std::nullopt, Error{"disk", 28, "full"}};
    FileManager& files = _services.fileManager;

    EXPECT_TRUE(files.createDirectoryAtPathWithIntermediateDirectoriesAttributes("/a", true, {}));
    EXPECT_FALSE(files.createDirectoryAtPathWithIntermediateDirectoriesAttributes(
        "/a/b", false, {.posixPermissions = 0777}));

    EXPECT_EQ(takeLines(), (Lines{R"({"event":"file","op":"createDirectory","path":"/a",)"
                                  R"("intermediates":true,"mode":null})",
                                  R"({"event":"file","op":"createDirectory","path":"/a/b",)"
                                  R"("intermediates":false,"mode":"0777",)"
                                  R"("error":{"domain":"disk","code":28,"description":"full"}})"}));
}

TEST_F(DiagnosticsTracers, WhatIsOnlyAskedOfFilesIsNotTraced) {
    EXPECT_TRUE(_services.fileManager->isResourceReachable(FileURL("/a")));
    EXPECT_EQ(_services.fileManager->fileSystemRepresentation(FileURL("/a")), "/device/a");
    EXPECT_EQ(_services.fileManager->tidewaterIdentityToken(), Text("token"));

    EXPECT_EQ(takeLines(), Lines{});
}

TEST_F(DiagnosticsTracers, AProgramIsTracedByTheDevicesOwnPaths) {
    SpawnRequest request{.path = "/usr/bin/tool",
                         .arguments = {"tool", "/device/a/b", "/device", "/devices/c"}};
    request.fileActions.addopen(1, "/first", O_RDWR, 0666);
    request.fileActions.addopen(1, "/out", O_RDWR, 0666);
    request.fileActions.addopen(2, "/messages", O_RDWR, 0666);

    EXPECT_EQ(_services.processes->posix_spawn(request), 42);

    EXPECT_EQ(takeLines(), (Lines{R"({"event":"spawn","path":"/usr/bin/tool",)"
                                  R"("argv":["tool","/a/b","/device","/devices/c"],)"
                                  R"("environment":null,"result":0,)"
                                  R"("stdout":"/out","stderr":"/messages"})"}));
    EXPECT_EQ(_platform.processes.requests.front().arguments, request.arguments);
}

TEST_F(DiagnosticsTracers, OnThisMachineThePathsAreTheDevicesOwnAlready) {
    _platform.fileManager.machineRoot = "";

    EXPECT_TRUE(_services.processes->posix_spawn(
        {.path = "/tool", .fileActions = {}, .arguments = {"/a/b"}, .environment = {}}));

    EXPECT_NE(takeLines().front().find(R"("argv":["/a/b"])"), std::string::npos);
}

TEST_F(DiagnosticsTracers, AProgramThatDoesNotStartIsTracedWithTheReason) {
    _platform.processes.spawned = std::unexpected(2);

    EXPECT_FALSE(_services.processes->posix_spawn(
        {.path = "/tool", .fileActions = {}, .arguments = {}, .environment = {{"A=b"}}}));

    EXPECT_EQ(takeLines(), (Lines{R"({"event":"spawn","path":"/tool","argv":[],)"
                                  R"("environment":["A=b"],"result":2,)"
                                  R"("stdout":null,"stderr":null})"}));
}

TEST_F(DiagnosticsTracers, TheEndOfAProgramIsTraced) {
    _platform.processes.status = 0x0100;
    EXPECT_EQ(_services.processes->waitpid(42), 0x0100);
    _platform.processes.status = std::unexpected(10);
    EXPECT_FALSE(_services.processes->waitpid(42));

    EXPECT_EQ(takeLines(), (Lines{R"({"event":"exit","status":256})"}));
}

TEST_F(DiagnosticsTracers, TasksAreTraced) {
    struct Page final : Controller {
        void reloadSpecifiers() override {}
    };
    const auto page = std::make_shared<Page>();
    const auto root = _tracer.makeRootController();

    root->addTask(page);
    EXPECT_TRUE(root->taskIsRunning(page));
    root->taskFinished(page);
    EXPECT_FALSE(root->taskIsRunning(page));

    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"task","op":"add"})", R"({"event":"task","op":"finished"})"}));
}

TEST_F(DiagnosticsTracers, AShareSheetIsTracedUntilItIsDismissed) {
    auto sheet = std::make_shared<ShareSheet>(std::vector{FileURL("/a"), FileURL("/b")});
    sheet->setIncludedActivityTypes({ActivityTypeMail, ActivityTypeMessage});
    sheet->popoverPresentationController().sourceView =
        std::make_shared<TableCell>(_services, Rect(), "Row");

    _services.presenter->presentShareSheet(sheet, true);
    _services.presenter->dismissPresentedController(true);
    EXPECT_EQ(_platform.presenter.shareSheet, sheet);

    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"present","what":"share","animated":true,"items":["/a","/b"],)"
                     R"("activities":["ActivityTypeMail","ActivityTypeMessage"],)"
                     R"("anchor":"Row"})",
                     R"({"event":"dismiss","what":"share","animated":true})"}));

    _platform.presenter.shareSheet.reset();
    sheet.reset();
    _services.presenter->dismissPresentedController(false);
    EXPECT_EQ(takeLines(), (Lines{R"({"event":"dismiss","what":"upgrade","animated":false})"}));
}

TEST_F(DiagnosticsTracers, AShareSheetThatStandsByItselfHasNoAnchor) {
    const auto sheet = std::make_shared<ShareSheet>(std::vector<FileURL>());

    _services.presenter->presentShareSheet(sheet, false);

    EXPECT_EQ(takeLines(), (Lines{R"({"event":"present","what":"share","animated":false,)"
                                  R"("items":[],"activities":[],"anchor":null})"}));
}

} // namespace
} // namespace nimbra::host

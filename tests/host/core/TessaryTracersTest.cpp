#include "platform/system/ClassRegistry.h"
#include "tests/host/core/TracersFixture.h"

namespace nimbra::host {
namespace {

TEST_F(Tracers, TellWhetherABundleCouldBeLoaded) {
    const auto bundle = std::make_shared<test::FakeBundle>(BundleIdentifier("b"));
    bundle->loaded = false;
    bundle->onLoad = [tries = 0]() mutable { return ++tries > 1; };
    _platform.bundles.bundleAtPath = bundle;

    const auto traced = _services.bundles->bundleWithPath("/System/B.bundle");
    ASSERT_NE(traced, nullptr);
    EXPECT_FALSE(traced->isLoaded());
    EXPECT_FALSE(traced->load());
    EXPECT_TRUE(traced->load());

    EXPECT_TRUE(traced->isLoaded());
    EXPECT_EQ(traced->identifier(), BundleIdentifier("b"));
    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"bundle","op":"load","path":"/System/B.bundle","loaded":false})",
                     R"({"event":"bundle","op":"load","path":"/System/B.bundle","loaded":true})"}));
}

TEST_F(Tracers, PassOnWhatElseIsAskedOfABundle) {
    _platform.bundles.bundleAtPath = _platform.bundles.paneBundle;
    const auto image = std::make_shared<const Image>();
    _platform.bundles.paneBundle->images.emplace("Logo", image);

    const auto traced = _services.bundles->bundleWithPath("/System/B.bundle");

    EXPECT_EQ(traced->localizedStringForKeyValueTable("CLOUD_DRIVE", "none", "Localizable"),
              Text("Nimbra Drive"));
    EXPECT_EQ(traced->imageNamed("Logo"), image);
    EXPECT_EQ(_services.bundles->bundleWithIdentifier(
                  BundleIdentifier("com.vantrel.NimbraDriveSettings")),
              _platform.bundles.paneBundle);
    EXPECT_EQ(_services.bundles->bundleForClass(typeid(int)), nullptr);
    EXPECT_EQ(takeLines(), Lines());
}

TEST_F(Tracers, GiveNoBundleWhereThereIsNone) {
    EXPECT_EQ(_services.bundles->bundleWithPath("/System/B.bundle"), nullptr);
    EXPECT_EQ(takeLines(), Lines());
}

TEST_F(Tracers, TraceTheAccountOfTheDatabaseButNotThatItIsAskedFor) {
    _platform.accountStore.stored.tessaryAccount = "database";
    _platform.accountStore.stored.isPrimary = true;
    _platform.accountStore.stored.provisioned = {kAccountDataclassTSYDatabaseService};
    const auto account =
        _services.accountStore->accountWithIdentifier(AccountIdentifier("primary"));
    takeLines();

    EXPECT_TRUE(account->vt_isPrimaryAccount());
    EXPECT_TRUE(account->isProvisionedForDataclass(kAccountDataclassTSYDatabaseService));
    const auto database = account->vt_tessaryAccount();
    ASSERT_NE(database, nullptr);
    EXPECT_EQ(takeLines(), Lines());

    database->vt_setUsesStratafile(true);
    EXPECT_EQ(takeLines(), (Lines{R"({"event":"account","op":"vt_setUsesStratafile:",)"
                                  R"("account":"database","dataclass":null,"value":true})"}));
    EXPECT_EQ(database->vt_tessaryAccount(), nullptr);
}

TEST_F(Tracers, TellWhichPageALinkOpensAndOnWhichAccount) {
    const ControllerClass page{.name = "Page", .create = {}, .classOperations = {}};
    const auto link =
        Specifier::preferenceSpecifierNamed("a", {.detail = &page, .cell = LinkListCell});
    link->setUserInfo(
        {{AccountKey, std::shared_ptr<Account>(std::make_shared<test::FakeAccount>("database"))}});

    _tracer.traceDetail(*link);
    _tracer.traceDetail(*Specifier::preferenceSpecifierNamed("b", {.cell = LinkListCell}));

    EXPECT_EQ(takeLines(), (Lines{R"({"event":"detail","class":"Page","account":"database"})",
                                  R"({"event":"detail","class":null,"account":null})"}));
}

} // namespace
} // namespace nimbra::host

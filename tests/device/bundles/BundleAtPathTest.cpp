#include "tests/device/bundles/TestBundles.h"
#include "tests/device/bundles/TestImages.h"

#include <gmock/gmock.h>

namespace nimbra::device {
namespace {

using testing::ElementsAre;
using testing::StartsWith;

constexpr const char* devicePath = "/System/Library/A.bundle";

/// Bundles that are found at their paths on a device.
class BundleAtPathTest : public BundlesFixture {
protected:
    [[nodiscard]] std::filesystem::path place() const {
        return folder().parent_path() / "device/System/Library/A.bundle";
    }
    [[nodiscard]] std::shared_ptr<Bundle> found() { return bundles().bundleWithPath(devicePath); }

    /// Expects that the bundle is found, cannot be loaded and is not loaded, for this reason, and
    /// that no class of it is left behind.
    void expectFailure(const std::string& reason) {
        const auto bundle = found();
        ASSERT_NE(bundle, nullptr);
        EXPECT_FALSE(bundle->isLoaded());

        const auto loaded = bundle->load();

        ASSERT_FALSE(loaded);
        EXPECT_THAT(loaded.error().description, StartsWith(devicePath + reason));
        EXPECT_FALSE(bundle->isLoaded());
        EXPECT_FALSE(found()->isLoaded());
        EXPECT_EQ(classes().classNamed("FirstController"), nullptr);
        EXPECT_THAT(log().lines(), ElementsAre("Can't load bundle: " + loaded.error().description));
        EXPECT_EQ(log().lines().front().find('\n'), std::string::npos);
    }
};

TEST_F(BundleAtPathTest, IsFoundUnloadedAndLoadedOnDemand) {
    makeBundle(place());
    const auto bundle = found();
    ASSERT_NE(bundle, nullptr);
    EXPECT_FALSE(bundle->isLoaded());
    EXPECT_EQ(classes().classNamed("FirstController"), nullptr);

    EXPECT_TRUE(bundle->load());

    EXPECT_TRUE(bundle->isLoaded());
    EXPECT_TRUE(found()->isLoaded());
    EXPECT_NE(classes().classNamed("FirstController"), nullptr);
    EXPECT_EQ(bundles().bundleWithIdentifier(BundleIdentifier("com.example.a")), found());
    EXPECT_TRUE(bundle->load());
    EXPECT_TRUE(found()->load());
    EXPECT_TRUE(log().lines().empty());
}

TEST_F(BundleAtPathTest, HasIdentifierTextsAndImagesOnceItIsLoaded) {
    makeBundle(place());
    test::writeTestFile(place() / "en/Localizable.json", R"({"KEY": "text"})");
    test::writeTestImage(place() / "Logo.png", 4, 2);
    const auto bundle = found();
    EXPECT_EQ(bundle->identifier(), std::nullopt);
    EXPECT_EQ(bundle->localizedStringForKeyValueTable("KEY", "none", "Localizable"), Text("none"));
    EXPECT_EQ(bundle->imageNamed("Logo"), nullptr);

    ASSERT_TRUE(bundle->load());

    EXPECT_EQ(bundle->identifier(), BundleIdentifier("com.example.a"));
    EXPECT_EQ(bundle->localizedStringForKeyValueTable("KEY", "none", "Localizable"), Text("text"));
    EXPECT_NE(bundle->imageNamed("Logo"), nullptr);
}

TEST_F(BundleAtPathTest, IsNoneWhereNoFolderIs) {
    EXPECT_EQ(found(), nullptr);

    test::writeTestFile(place(), "a file");
    EXPECT_EQ(found(), nullptr);
    EXPECT_EQ(bundles().bundleWithPath(Text()), nullptr);
    EXPECT_TRUE(log().lines().empty());
}

TEST_F(BundleAtPathTest, IsLookedForBelowTheDevicesRootAlone) {
    makeBundle(place());
    std::filesystem::create_directory_symlink("/", place().parent_path() / "Link");

    EXPECT_EQ(bundles().bundleWithPath(place().string()), nullptr);
    const auto linked = bundles().bundleWithPath("/System/Library/Link/../System/Library/A.bundle");
    ASSERT_NE(linked, nullptr);
    ASSERT_TRUE(linked->load());
    EXPECT_TRUE(found()->isLoaded());
}

TEST_F(BundleAtPathTest, StaysFoundAndLoadedWhenItsFolderGoes) {
    makeBundle(place());
    const auto bundle = found();
    ASSERT_TRUE(bundle->load());

    std::filesystem::remove_all(place());

    EXPECT_TRUE(bundle->isLoaded());
    ASSERT_NE(found(), nullptr);
    EXPECT_TRUE(found()->isLoaded());
    EXPECT_NE(classes().classNamed("FirstController"), nullptr);
}

TEST_F(BundleAtPathTest, NeedsNoFirstClass) {
    makeBundle(place());
    test::writeTestFile(place() / "manifest.json", R"({"identifier": "i", "executable": "A.so"})");

    EXPECT_TRUE(found()->load());

    EXPECT_NE(classes().classNamed("FirstController"), nullptr);
    EXPECT_EQ(failureOf(place()),
              place().string() + ": its first class was not there when it was loaded");
}

TEST_F(BundleAtPathTest, MayNameAFirstClassThatItDoesNotHave) {
    makeBundle(place(), "test-object-first", "com.example.a", "TSYSettingsController");

    EXPECT_TRUE(found()->load());

    EXPECT_TRUE(found()->isLoaded());
    EXPECT_EQ(classes().classNamed("TSYSettingsController"), nullptr);
}

TEST_F(BundleAtPathTest, CannotBeLoadedWithoutItsSharedObject) {
    makeBundle(place());
    std::filesystem::remove(place() / "A.so");

    expectFailure("/A.so: the bundle's shared object cannot be loaded: No such file or directory");
}

TEST_F(BundleAtPathTest, CannotBeLoadedFromWhatIsNoSharedObject) {
    makeBundle(place());
    test::writeTestFile(place() / "A.so", "not a shared object, but long enough for a header");

    expectFailure("/A.so: the bundle's shared object cannot be loaded: ");
    EXPECT_EQ(log().lines().front().find(folder().parent_path().string()), std::string::npos);
}

TEST_F(BundleAtPathTest, CannotBeLoadedWithoutItsEntryPoint) {
    makeBundle(place(), "test-object-empty");

    expectFailure("/A.so: the bundle's shared object lacks its entry point "
                  "NimbraBundleRegisterClasses");
}

TEST_F(BundleAtPathTest, CannotBeLoadedWhenItsEntryPointThrows) {
    makeBundle(place(), "test-object-throwing");

    expectFailure("/A.so: its entry point has thrown: no way");
}

TEST_F(BundleAtPathTest, CannotBeLoadedWhenItsEntryPointThrowsWhatIsNoException) {
    makeBundle(place(), "test-object-throwing-number");

    expectFailure("/A.so: its entry point has thrown");
}

TEST_F(BundleAtPathTest, CannotBeLoadedWhenTheNameOfItsClassIsTaken) {
    makeBundle(place(), "test-object-second");
    ASSERT_TRUE(classes().registerClass({.name = "SecondController"}));
    const ControllerClass* first = classes().classNamed("SecondController");

    expectFailure("/A.so: the name of one of its classes is taken");
    EXPECT_EQ(classes().classNamed("SecondController"), first);
}

TEST_F(BundleAtPathTest, CannotBeLoadedWithoutAManifest) {
    makeBundle(place());
    std::filesystem::remove(place() / "manifest.json");

    expectFailure("/manifest.json: cannot be read: No such file or directory");
}

TEST_F(BundleAtPathTest, CanBeLoadedOnceItsFaultIsMended) {
    makeBundle(place(), "test-object-throwing");
    ASSERT_FALSE(found()->load());

    // Under another name, as the linker knows the first object by its own.
    std::filesystem::remove_all(place());
    makeBundle(place());
    std::filesystem::rename(place() / "A.so", place() / "B.so");
    test::writeTestFile(place() / "manifest.json", R"({"identifier": "i", "executable": "B.so"})");

    EXPECT_TRUE(found()->load());
    EXPECT_NE(classes().classNamed("FirstController"), nullptr);
}

} // namespace
} // namespace nimbra::device

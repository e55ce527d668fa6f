#include "platform/host/SettingsListController.h"
#include "tests/device/bundles/TestBundles.h"
#include "tests/support/TestPlatform.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <functional>
#include <limits>
#include <link.h>
#include <sys/stat.h>
#include <typeinfo>
#include <vector>

namespace nimbra::device {
namespace {

/// What the linker is told of the parts of a shared object, to be read and changed.
class ObjectHeaders {
public:
    explicit ObjectHeaders(std::string bytes) : _bytes(std::move(bytes)) {
        std::memcpy(&header, _bytes.data(), sizeof(header));
        _place = header.e_phoff;
        _segments.resize(header.e_phnum);
        std::memcpy(_segments.data(), &_bytes[_place], sizeof(ElfW(Phdr)) * _segments.size());
    }

    ElfW(Ehdr) header {};

    [[nodiscard]] ElfW(Phdr) & lastLoaded() {
        return *std::ranges::max_element(_segments, {}, [](const auto& segment) {
            return segment.p_type == PT_LOAD ? segment.p_offset + segment.p_filesz : 0;
        });
    }
    /// Where the last segment that is loaded ends.
    [[nodiscard]] std::uint64_t end() { return lastLoaded().p_offset + lastLoaded().p_filesz; }

    /// The whole object, with what has been changed.
    [[nodiscard]] std::string bytes() const {
        std::string changed = _bytes;
        std::memcpy(&changed[_place], _segments.data(), sizeof(ElfW(Phdr)) * _segments.size());
        std::memcpy(changed.data(), &header, sizeof(header));
        return changed;
    }

private:
    std::string _bytes;
    std::uint64_t _place;
    std::vector<ElfW(Phdr)> _segments;
};

class DeviceBundlesTest : public BundlesFixture {
protected:
    [[nodiscard]] static std::string testObject() {
        return test::contentOf(std::filesystem::path(NIMBRA_TEST_OBJECTS) / "test-object-first.so");
    }
    [[nodiscard]] std::string cannotBeLoaded(const std::string& why) const {
        return (folder() / "A.so").string() +
               ": the bundle's shared object cannot be loaded: " + why;
    }

    /// An object of the class that the shared object of `bundle` has registered.
    [[nodiscard]] std::shared_ptr<SettingsListController> objectOf(const DeviceBundle& bundle) {
        return bundle.principalClass().create(_platform.services());
    }
    /// The bundle of that class.
    [[nodiscard]] std::shared_ptr<Bundle> bundleOfClassIn(const DeviceBundle& bundle) {
        const auto object = objectOf(bundle);
        const SettingsListController& controller = *object;
        return bundles().bundleForClass(typeid(controller));
    }

private:
    test::TestPlatform _platform;
};

TEST_F(DeviceBundlesTest, ALoadedBundleIsFoundByItsIdentifier) {
    makeBundle(folder());

    const auto bundle = load();

    EXPECT_EQ(bundle->identifier(), BundleIdentifier("com.example.a"));
    EXPECT_EQ(bundle->principalClass().name, "FirstController");
    EXPECT_EQ(classes().classNamed("FirstController"), &bundle->principalClass());
    EXPECT_EQ(bundles().bundleWithIdentifier(BundleIdentifier("com.example.a")), bundle);
    EXPECT_EQ(bundles().bundleWithIdentifier(BundleIdentifier("com.example.b")), nullptr);
}

TEST_F(DeviceBundlesTest, TheSameFolderGivesTheSameBundle) {
    makeBundle(folder());
    std::filesystem::create_directory_symlink(folder(), folder().parent_path() / "link");

    const auto bundle = load();

    EXPECT_EQ(load(), bundle);
    EXPECT_EQ(bundles().load(folder().parent_path() / "link"), bundle);
}

TEST_F(DeviceBundlesTest, AnotherPlatformOfTheProcessLoadsTheSameFolderForItself) {
    makeBundle(folder());
    const auto bundle = load();
    ClassRegistry otherClasses;
    DeviceBundles others(paths(), settings(), otherClasses, log());

    const auto other = others.load(folder());

    ASSERT_TRUE(other) << other.error();
    EXPECT_NE(*other, bundle);
    EXPECT_EQ(otherClasses.classNamed("FirstController"), &(*other)->principalClass());
}

TEST_F(DeviceBundlesTest, ABundleCanBeHiddenFromTheLookup) {
    makeBundle(folder());
    const BundleIdentifier identifier("com.example.a");

    bundles().setFindable(identifier, false);
    const auto bundle = load();
    EXPECT_EQ(bundles().bundleWithIdentifier(identifier), nullptr);

    bundles().setFindable(identifier, true);
    EXPECT_EQ(bundles().bundleWithIdentifier(identifier), bundle);
}

TEST_F(DeviceBundlesTest, AClassBelongsToTheBundleWhoseObjectHoldsIt) {
    makeBundle(folder());
    const auto second = folder().parent_path() / "B.bundle";
    makeBundle(second, "test-object-second", "com.example.b", "SecondController");

    const auto bundle = load();
    const auto other = bundles().load(second);

    ASSERT_TRUE(other) << other.error();
    EXPECT_EQ(bundleOfClassIn(*bundle), bundle);
    EXPECT_EQ(bundleOfClassIn(**other), *other);
}

TEST_F(DeviceBundlesTest, AClassFindsABundleThatIsHiddenFromTheLookup) {
    makeBundle(folder());
    bundles().setFindable(BundleIdentifier("com.example.a"), false);

    const auto bundle = load();

    EXPECT_EQ(bundleOfClassIn(*bundle), bundle);
}

TEST_F(DeviceBundlesTest, AClassFindsABundleThatWasLoadedOnAnotherWay) {
    makeBundle(folder());
    const auto link = folder().parent_path() / "link";
    std::filesystem::create_directory_symlink(folder(), link);
    const auto before = std::filesystem::current_path();

    const auto linked = bundles().load(link);
    ASSERT_TRUE(linked) << linked.error();
    EXPECT_EQ(bundleOfClassIn(**linked), *linked);

    const auto second = folder().parent_path() / "B.bundle";
    makeBundle(second, "test-object-second", "com.example.b", "SecondController");
    std::filesystem::current_path(folder().parent_path());
    const auto relative = bundles().load("B.bundle");
    std::filesystem::current_path(before);
    ASSERT_TRUE(relative) << relative.error();
    EXPECT_EQ(bundleOfClassIn(**relative), *relative);
}

TEST_F(DeviceBundlesTest, ABundleFoundByItsClassHasReplacedTextsAlsoWhereItsNameFindsNone) {
    makeBundle(folder());
    const auto bundle = load();
    bundles().setFindable(BundleIdentifier("com.example.a"), false);

    bundle->replaceTable("Localizable", {{"KEY", "given"}});

    const auto found = bundleOfClassIn(*bundle);
    ASSERT_NE(found, nullptr);
    EXPECT_EQ(found->localizedStringForKeyValueTable("KEY", "MISSING", "Localizable"),
              Text("given"));
}

TEST_F(DeviceBundlesTest, AClassOfNoLoadedBundleHasNone) {
    makeBundle(folder());
    const auto bundle = load();
    ClassRegistry otherClasses;
    const DeviceBundles others(paths(), settings(), otherClasses, log());
    const auto object = objectOf(*bundle);
    const SettingsListController& controller = *object;

    EXPECT_EQ(bundles().bundleForClass(typeid(DeviceBundles)), nullptr);
    EXPECT_EQ(bundles().bundleForClass(typeid(SettingsListController)), nullptr);
    EXPECT_EQ(bundles().bundleForClass(typeid(int)), nullptr);
    EXPECT_EQ(others.bundleForClass(typeid(controller)), nullptr);
}

TEST_F(DeviceBundlesTest, WhatIsNoFolderIsNoBundle) {
    test::writeTestFile(folder(), "a file");

    EXPECT_EQ(failureOf(folder()), folder().string() + ": is not a bundle: Not a directory");
    EXPECT_EQ(failureOf(folder().parent_path() / "none"),
              (folder().parent_path() / "none").string() +
                  ": is not a bundle: No such file or directory");
}

TEST_F(DeviceBundlesTest, AManifestThatIsWrongIsReportedWithItsPlace) {
    const auto manifest = folder() / "manifest.json";
    const auto failureWith = [&](const std::string& text) {
        test::writeTestFile(manifest, text);
        return failureOf(folder());
    };
    std::filesystem::create_directory(folder());
    EXPECT_EQ(failureOf(folder()),
              manifest.string() + ": cannot be read: No such file or directory");
    EXPECT_EQ(failureWith(R"({"executable": "A.so", "principalClass": "C"})"),
              manifest.string() +
                  ": /identifier: expected a string that is not empty, found nothing");
    EXPECT_EQ(failureWith(R"({"identifier": "i", "executable": "../A.so", "principalClass": "C"})"),
              manifest.string() + ": /executable: expected the name of a file beside the "
                                  "manifest, found \"../A.so\"");
    EXPECT_EQ(failureWith(R"({"identifier": "i", "version": 1})"),
              manifest.string() + ": /version: unknown key; expected one of identifier, "
                                  "executable, principalClass, developmentLanguage");
    EXPECT_EQ(failureWith(R"("bundle")"),
              manifest.string() + ": /: expected an object, found \"bundle\"");
}

TEST_F(DeviceBundlesTest, AStringTableThatIsWrongIsReportedWithItsPlace) {
    makeBundle(folder());
    const auto table = folder() / "de/Localizable.json";

    writeTable("de", R"({"KEY": 7})");
    EXPECT_EQ(failureOf(folder()), table.string() + ": /KEY: expected a text, found 7");
    writeTable("de", "{\n  \"KEY\": \"x\",\n}");
    EXPECT_EQ(failureOf(folder()),
              table.string() + ": line 3, column 1: not JSON: syntax error while parsing object "
                               "key - unexpected '}'; expected string literal");
    writeTable("de", R"(["x"])");
    EXPECT_EQ(failureOf(folder()),
              table.string() + ": /: expected an object of keys and texts, found [\"x\"]");
    EXPECT_EQ(classes().classNamed("FirstController"), nullptr);
}

TEST_F(DeviceBundlesTest, ABundleWithoutItsSharedObjectIsReported) {
    makeBundle(folder());
    std::filesystem::remove(folder() / "A.so");

    EXPECT_EQ(failureOf(folder()), (folder() / "A.so").string() +
                                       ": the bundle's shared object cannot be loaded: No such "
                                       "file or directory");
}

TEST_F(DeviceBundlesTest, AFileThatIsNoSharedObjectIsReported) {
    makeBundle(folder());
    test::writeTestFile(folder() / "A.so", "not a shared object, but long enough for a header");

    const std::string failure = failureOf(folder());

    EXPECT_TRUE(failure.starts_with((folder() / "A.so").string() +
                                    ": the bundle's shared object cannot be loaded: "))
        << failure;
    EXPECT_EQ(failure.find('\n'), std::string::npos);
}

TEST_F(DeviceBundlesTest, ASharedObjectThatIsCutOffIsReported) {
    const std::uint64_t needed = ObjectHeaders(testObject()).end();
    ASSERT_GT(needed, 4096U);
    const std::uint64_t within[] = {sizeof(ElfW(Ehdr)), 1000, 4096, needed / 2, needed - 1};

    for (const std::uint64_t length : within) {
        makeBundle(folder());
        std::filesystem::resize_file(folder() / "A.so", length);

        EXPECT_EQ(failureOf(folder()), cannotBeLoaded("is cut off")) << length;
    }
}

TEST_F(DeviceBundlesTest, ASharedObjectNeedsNothingBehindItsLastSegment) {
    makeBundle(folder());
    std::filesystem::resize_file(folder() / "A.so", ObjectHeaders(testObject()).end());

    EXPECT_EQ(load()->principalClass().name, "FirstController");
}

TEST_F(DeviceBundlesTest, ASharedObjectWhosePlacesPassEveryEndIsReported) {
    const auto failureWith = [this](const std::function<void(ObjectHeaders&)>& change) {
        makeBundle(folder());
        ObjectHeaders headers(testObject());
        change(headers);
        test::writeTestFile(folder() / "A.so", headers.bytes());
        return failureOf(folder());
    };
    // Added to what follows from there, each comes out small.
    constexpr auto far = std::numeric_limits<std::uint64_t>::max() - 15;

    EXPECT_EQ(failureWith([](auto& headers) { headers.header.e_phoff = far; }),
              cannotBeLoaded("is cut off"));
    EXPECT_EQ(failureWith([](auto& headers) { headers.lastLoaded().p_offset = far; }),
              cannotBeLoaded("is cut off"));
    EXPECT_EQ(failureWith([](auto& headers) { headers.lastLoaded().p_filesz = far; }),
              cannotBeLoaded("is cut off"));
    EXPECT_EQ(failureWith([](auto& headers) { headers.header.e_phnum = 0xffff; }),
              cannotBeLoaded("is cut off"));
}

TEST_F(DeviceBundlesTest, WhatHasTooLittleForAHeaderIsReported) {
    for (const std::uint64_t length : {0U, 4U, 40U, 63U}) {
        makeBundle(folder());
        std::filesystem::resize_file(folder() / "A.so", length);

        EXPECT_TRUE(failureOf(folder()).starts_with(cannotBeLoaded(""))) << length;
    }
}

TEST_F(DeviceBundlesTest, APipeOrAFolderInThePlaceOfASharedObjectIsReported) {
    makeBundle(folder());
    std::filesystem::remove(folder() / "A.so");
    ASSERT_EQ(::mkfifo((folder() / "A.so").c_str(), 0644), 0);
    EXPECT_EQ(failureOf(folder()), cannotBeLoaded("is not a plain file"));

    std::filesystem::remove(folder() / "A.so");
    std::filesystem::create_directory(folder() / "A.so");
    EXPECT_EQ(failureOf(folder()), cannotBeLoaded("is a directory"));
}

TEST_F(DeviceBundlesTest, ASharedObjectWithoutItsEntryPointIsReported) {
    makeBundle(folder(), "test-object-empty");

    EXPECT_EQ(failureOf(folder()), (folder() / "A.so").string() +
                                       ": the bundle's shared object lacks its entry point "
                                       "NimbraBundleRegisterClasses");
}

TEST_F(DeviceBundlesTest, ABundleWhoseClassHasATakenNameIsReported) {
    makeBundle(folder());
    const auto first = load();
    const auto second = folder().parent_path() / "B.bundle";
    makeBundle(second, "test-object-same-class", "com.example.b");

    EXPECT_EQ(failureOf(second),
              (second / "A.so").string() + ": the name of one of its classes is taken");
    EXPECT_EQ(bundles().bundleWithIdentifier(BundleIdentifier("com.example.b")), nullptr);
}

TEST_F(DeviceBundlesTest, ABundleWithoutItsPrincipalClassIsReported) {
    makeBundle(folder());
    test::writeTestFile(folder() / "manifest.json",
                        R"({"identifier": "i", "executable": "A.so", "principalClass": "Other"})");

    EXPECT_EQ(failureOf(folder()), (folder() / "A.so").string() +
                                       ": registers no class named Other, the manifest's "
                                       "principalClass");
}

} // namespace
} // namespace nimbra::device

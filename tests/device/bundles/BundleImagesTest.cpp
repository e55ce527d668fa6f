#include "device/bundles/BundleImages.h"

#include "platform/views/Image.h"
#include "tests/device/bundles/TestBundles.h"
#include "tests/device/bundles/TestImages.h"

#include <optional>
#include <string>
#include <sys/stat.h>
#include <vector>

namespace nimbra::device {
namespace {

using test::writeTestFile;
using test::writeTestImage;

class BundleImagesTest : public BundlesFixture {
protected:
    BundleImagesTest() { makeBundle(folder()); }

    [[nodiscard]] std::filesystem::path image(const std::string& name) const {
        return folder() / name;
    }
    /// The size of the image `name` of the bundle as its folder is now; none for no image.
    [[nodiscard]] std::optional<Size> sizeOf(const std::string& name) {
        const auto found = BundleImages::read(folder(), "A.bundle", log()).imageNamed(name);
        if (!found) {
            return std::nullopt;
        }
        EXPECT_EQ(found->name, Text(name));
        return found->size;
    }
    /// Expects that `content` in the place of an image is told in one line and is no image.
    void expectLeftOut(const std::string& content, const std::string& reason) {
        writeTestFile(image("A.png"), content);
        test::RecordingLog told;
        EXPECT_EQ(BundleImages::read(folder(), "/A.bundle", told).imageNamed("A"), nullptr);
        EXPECT_EQ(told.lines(),
                  std::vector<std::string>{"/A.bundle/A.png: expected a PNG image: " + reason});
    }
};

TEST_F(BundleImagesTest, ALoadedBundleGivesItsImageInPoints) {
    writeTestImage(image("Logo@3x.png"), 288, 192);

    const auto bundle = load();
    const auto logo = bundle->imageNamed("Logo");

    ASSERT_TRUE(logo);
    EXPECT_EQ(logo->name, Text("Logo"));
    EXPECT_EQ(logo->size, (Size{96, 64}));
    EXPECT_EQ(bundle->imageNamed("Logo"), logo);
}

TEST_F(BundleImagesTest, ANameWithoutAnImageGivesNull) {
    writeTestImage(image("Logo@3x.png"), 3, 3);

    const auto bundle = load();

    for (const Text& name : {Text("logo"), Text("Logo@3x"), Text("Logo.png"), Text("Logo@3x.png"),
                             Text(""), Text(), Text("../A"), Text(std::string(10'000, 'x'))}) {
        EXPECT_EQ(bundle->imageNamed(name), nullptr) << name;
    }
}

TEST_F(BundleImagesTest, TheEndingOfAFileSaysHowManyPixelsAPointHas) {
    writeTestImage(image("one.png"), 30, 12);
    writeTestImage(image("two@2x.png"), 30, 12);
    writeTestImage(image("three@3x.png"), 31, 12);

    EXPECT_EQ(sizeOf("one"), (Size{30, 12}));
    EXPECT_EQ(sizeOf("two"), (Size{15, 6}));
    EXPECT_EQ(sizeOf("three"), (Size{31.0 / 3, 4}));
}

TEST_F(BundleImagesTest, OtherEndingsBelongToTheName) {
    const std::vector<std::string> names{"a@4x",    "b@1x", "c@x",   "d@2X", "e2x", "@2x",
                                         ".hidden", "f@",   "g@2x ", "h.i",  "ü"};
    for (const std::string& name : names) {
        writeTestImage(image(name + ".png"), 6, 6);
        EXPECT_EQ(sizeOf(name), (Size{6, 6})) << name;
    }
    writeTestImage(image("j@3x@2x.png"), 6, 6);
    EXPECT_EQ(sizeOf("j@3x"), (Size{3, 3}));
    EXPECT_EQ(sizeOf("j"), std::nullopt);
}

TEST_F(BundleImagesTest, OfSeveralFilesTheOneWithTheMostPixelsAPointCounts) {
    writeTestImage(image("A.png"), 10, 10);
    EXPECT_EQ(sizeOf("A"), (Size{10, 10}));
    writeTestImage(image("A@3x.png"), 36, 36);
    EXPECT_EQ(sizeOf("A"), (Size{12, 12}));
    writeTestImage(image("A@2x.png"), 22, 22);
    EXPECT_EQ(sizeOf("A"), (Size{12, 12}));
    std::filesystem::remove(image("A@3x.png"));
    EXPECT_EQ(sizeOf("A"), (Size{11, 11}));
}

TEST_F(BundleImagesTest, FilesThatAreNoImagesBesideTheManifestAreNotRead) {
    writeTestFile(image("A.PNG"), "text");
    writeTestFile(image("A.jpeg"), "text");
    writeTestFile(image("A.png.txt"), "text");
    writeTestFile(folder() / "en" / "A.png", "text");

    EXPECT_EQ(load()->imageNamed("A"), nullptr);
}

TEST_F(BundleImagesTest, AFileThatIsNoImageIsOneLineInTheLogAndLeftOut) {
    writeTestImage(image("good.png"), 2, 2);
    const std::string good = test::contentOf(image("good.png"));

    expectLeftOut("a text, and not a picture at all", "Not a PNG file");
    expectLeftOut("", "Read Error");
    expectLeftOut(good.substr(0, 20), "Read Error");
    std::string damaged = good;
    damaged[19] = '\7'; // of the width, which the check sum no longer fits
    expectLeftOut(damaged, "IHDR: CRC error");
    EXPECT_EQ(sizeOf("good"), (Size{2, 2}));
}

TEST_F(BundleImagesTest, ABundleWithABrokenImageIsLoaded) {
    writeTestFile(image("A.png"), "text");

    const auto bundle = load();

    EXPECT_EQ(bundle->imageNamed("A"), nullptr);
    EXPECT_EQ(log().lines().size(), 1U);
}

TEST_F(BundleImagesTest, OfABrokenFileAndAnotherOfItsNameTheOtherCounts) {
    writeTestFile(image("A@3x.png"), "text");
    writeTestImage(image("A@2x.png"), 4, 4);

    EXPECT_EQ(sizeOf("A"), (Size{2, 2}));
}

TEST_F(BundleImagesTest, WhatIsNoFileIsNoImage) {
    std::filesystem::create_directory(image("A.png"));
    std::filesystem::create_symlink("nowhere", image("B.png"));
    ASSERT_EQ(::mkfifo(image("C.png").c_str(), 0600), 0);

    for (const char* const name : {"A", "B", "C"}) {
        EXPECT_EQ(sizeOf(name), std::nullopt) << name;
    }
    EXPECT_TRUE(log().lines().empty());
}

} // namespace
} // namespace nimbra::device

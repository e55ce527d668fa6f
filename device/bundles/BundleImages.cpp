#include "device/bundles/BundleImages.h"

#include "device/DeviceError.h"
#include "device/files/Files.h"
#include "platform/system/SystemLog.h"
#include "platform/views/Image.h"

#include <expected>
#include <png.h>
#include <system_error>

namespace nimbra::device {

namespace {

/// What the name of an image's file says.
struct ImageName {
    std::string name;
    int pixelsAPoint;
};

ImageName imageNameOf(const std::string& stem) {
    for (const int pixels : {2, 3}) {
        const std::string ending = '@' + std::to_string(pixels) + 'x';
        if (stem.size() > ending.size() && stem.ends_with(ending)) {
            return {.name = stem.substr(0, stem.size() - ending.size()), .pixelsAPoint = pixels};
        }
    }
    return {.name = stem, .pixelsAPoint = 1};
}

/// The size in pixels of the image at `path`, out of its first bytes.
std::expected<Size, Error> sizeInPixels(const std::filesystem::path& path) {
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    const bool isRead = png_image_begin_read_from_file(&image, path.c_str()) != 0;
    const Size size{.width = static_cast<double>(image.width),
                    .height = static_cast<double>(image.height)};
    const std::string reason = &image.message[0];
    png_image_free(&image);
    if (!isRead) {
        return std::unexpected(deviceError(path.string() + ": expected a PNG image: " + reason));
    }
    return size;
}

} // namespace

BundleImages BundleImages::read(const std::filesystem::path& folder, const std::string& name,
                                SystemLog& log) {
    const auto report = [&](const Error& error) {
        log.write(LogLevel::error, withPath(error, folder, name).description);
    };
    BundleImages images;
    const auto files = entriesOfDirectory(folder);
    if (!files) {
        report(files.error());
        return images;
    }
    std::map<std::string, int> pixelsAPoint;
    for (const std::filesystem::path& file : *files) {
        std::error_code failure;
        if (file.extension() != ".png" || !std::filesystem::is_regular_file(file, failure)) {
            continue;
        }
        const auto size = sizeInPixels(file);
        if (!size) {
            report(size.error());
            continue;
        }
        const auto [image, pixels] = imageNameOf(file.stem().string());
        if (int& most = pixelsAPoint[image]; pixels > most) {
            most = pixels;
            images._images[image] = std::make_shared<const Image>(
                Image{.name = image,
                      .size = {.width = size->width / pixels, .height = size->height / pixels}});
        }
    }
    return images;
}

std::shared_ptr<const Image> BundleImages::imageNamed(const std::string& name) const {
    const auto image = _images.find(name);
    return image != _images.end() ? image->second : nullptr;
}

} // namespace nimbra::device

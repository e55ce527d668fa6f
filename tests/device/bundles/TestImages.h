#pragma once

#include <cstdint>
#include <filesystem>
#include <gtest/gtest.h>
#include <png.h>
#include <vector>

namespace nimbra::test {

/// Writes a grey PNG image of so many pixels.
inline void writeTestImage(const std::filesystem::path& path, std::uint32_t width,
                           std::uint32_t height) {
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    image.width = width;
    image.height = height;
    image.format = PNG_FORMAT_GRAY;
    const std::vector<std::uint8_t> pixels(std::size_t{width} * height, 127);
    EXPECT_NE(png_image_write_to_file(&image, path.c_str(), 0, pixels.data(), 0, nullptr), 0)
        << &image.message[0];
}

} // namespace nimbra::test

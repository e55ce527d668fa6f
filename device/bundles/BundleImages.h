#pragma once

#include <filesystem>
#include <map>
#include <memory>
#include <string>

namespace nimbra {
struct Image;
class SystemLog;
} // namespace nimbra

namespace nimbra::device {

/// The images of a bundle by their names.
class BundleImages {
public:
    /// Reads the size of every file NAME.png in `folder`. In NAME@2x.png and NAME@3x.png a point
    /// has two and three pixels in each direction; of several files of one name the one with the
    /// most counts. A folder that cannot be read, and a file that is no PNG image, is told to `log`
    /// in one line, which calls the folder `name`, and left out, as a page can do without a
    /// picture.
    [[nodiscard]] static BundleImages read(const std::filesystem::path& folder,
                                           const std::string& name, SystemLog& log);

    /// Null for a name without an image.
    [[nodiscard]] std::shared_ptr<const Image> imageNamed(const std::string& name) const;

private:
    std::map<std::string, std::shared_ptr<const Image>> _images;
};

} // namespace nimbra::device

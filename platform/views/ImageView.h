#pragma once

#include "platform/views/Image.h"
#include "platform/views/View.h"

#include <memory>

namespace nimbra {

/// A picture on the screen.
class ImageView final : public View {
public:
    /// As large as `image`, which it shares; null for an empty view.
    ImageView(const PlatformServices& services, std::shared_ptr<const Image> image);

    [[nodiscard]] const std::shared_ptr<const Image>& image() const { return _image; }

    /// The size of the image; nothing without one.
    [[nodiscard]] Size intrinsicContentSize() const override;

private:
    std::shared_ptr<const Image> _image;
};

} // namespace nimbra

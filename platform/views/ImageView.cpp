#include "platform/views/ImageView.h"

#include <utility>

namespace nimbra {

ImageView::ImageView(const PlatformServices& services, std::shared_ptr<const Image> image)
    : View(services, {.origin = {}, .size = image ? image->size : Size()}),
      _image(std::move(image)) {}

Size ImageView::intrinsicContentSize() const {
    return _image ? _image->size : Size();
}

} // namespace nimbra

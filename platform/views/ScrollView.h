#pragma once

#include "platform/views/View.h"

namespace nimbra {

/// A view through which one sees a part of what may be larger.
class ScrollView final : public View {
public:
    using View::View;

    /// The size of what it holds; where that is larger than the view, a host lets the user scroll.
    [[nodiscard]] const Size& contentSize() const { return _contentSize; }
    void setContentSize(const Size& size) { _contentSize = size; }

private:
    Size _contentSize;
};

} // namespace nimbra

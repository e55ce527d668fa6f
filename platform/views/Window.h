#pragma once

namespace nimbra {

/// What views are shown in; the host owns it. Views know it by its identity only.
class Window {
public:
    Window() = default;
    Window(const Window&) = delete;
    Window& operator=(const Window&) = delete;
    ~Window() = default;
};

} // namespace nimbra

#pragma once

#include <unistd.h>
#include <utility>

namespace nimbra::device {

/// A file descriptor, closed with this object.
class Descriptor {
public:
    /// Takes over `number`, which is negative where opening has failed.
    explicit Descriptor(int number) : _number(number) {}
    Descriptor(Descriptor&& other) noexcept : _number(std::exchange(other._number, -1)) {}
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;
    Descriptor& operator=(Descriptor&&) = delete;
    ~Descriptor() {
        if (_number >= 0) {
            ::close(_number);
        }
    }

    [[nodiscard]] bool isOpen() const { return _number >= 0; }
    [[nodiscard]] int number() const { return _number; }

private:
    int _number;
};

} // namespace nimbra::device

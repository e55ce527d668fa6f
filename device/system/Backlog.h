#pragma once

#include "device/files/Descriptor.h"

#include <atomic>
#include <memory>

namespace nimbra::device {

/// How much of what has come in waits to be done, for a thread that takes in no more while it is
/// too much. Any thread.
class Backlog : public std::enable_shared_from_this<Backlog> {
public:
    /// Full with so many pieces.
    static constexpr int most = 64;

    Backlog();

    /// One more piece, which counts until the last copy of the result goes.
    [[nodiscard]] std::shared_ptr<void> add();

    [[nodiscard]] bool isFull() const { return _count >= most; }

    /// Readable when a piece has gone since `takeBack`; for `poll`, and owned by the backlog.
    /// Negative where the system has no more descriptors: then nobody may wait for room.
    [[nodiscard]] int descriptor() const { return _room.number(); }
    void takeBack() const;

private:
    void remove();

    std::atomic<int> _count = 0;
    const Descriptor _room;
};

} // namespace nimbra::device

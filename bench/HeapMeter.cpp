#include "bench/HeapMeter.h"

#include <atomic>
#include <cstdlib>
#include <malloc.h>
#include <new>

namespace {

std::atomic<std::size_t> taken = 0;
std::atomic<std::size_t> mostTaken = 0;

void* noted(void* block) {
    if (block == nullptr) {
        throw std::bad_alloc();
    }
    const std::size_t size = ::malloc_usable_size(block);
    const std::size_t now = taken.fetch_add(size, std::memory_order_relaxed) + size;
    std::size_t most = mostTaken.load(std::memory_order_relaxed);
    while (most < now && !mostTaken.compare_exchange_weak(most, now, std::memory_order_relaxed)) {
    }
    return block;
}

void give(void* block) {
    taken.fetch_sub(::malloc_usable_size(block), std::memory_order_relaxed);
    std::free(block);
}

} // namespace

// Every allocation of the program goes through these; the array forms and the sized ones call them.

void* operator new(std::size_t size) {
    return noted(std::malloc(size));
}

void* operator new(std::size_t size, std::align_val_t alignment) {
    const auto boundary = static_cast<std::size_t>(alignment);
    return noted(std::aligned_alloc(boundary, (size + boundary - 1) / boundary * boundary));
}

void operator delete(void* block) noexcept {
    give(block);
}

void operator delete(void* block, std::size_t /*size*/) noexcept {
    give(block);
}

void operator delete(void* block, std::align_val_t /*alignment*/) noexcept {
    give(block);
}

void operator delete(void* block, std::size_t /*size*/, std::align_val_t /*alignment*/) noexcept {
    give(block);
}

namespace nimbra::bench {

HeapMeter::HeapMeter() : _atStart(taken.load()) {
    mostTaken.store(_atStart);
}

std::size_t HeapMeter::peak() const {
    return mostTaken.load() - _atStart;
}

} // namespace nimbra::bench

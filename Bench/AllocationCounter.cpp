#include "Bench/AllocationCounter.h"

#include <atomic>
#include <cstddef>
#include <cstdlib>
#include <malloc.h>
#include <new>

namespace {

std::atomic<bool> isCounting{false};
std::atomic<std::uint64_t> allocations{0};
std::atomic<std::int64_t> allocatedBytes{0};

std::int64_t usableBytes(void *memory) noexcept {
    return static_cast<std::int64_t>(malloc_usable_size(memory));
}

void *counted(void *memory) {
    if (!memory)
        throw std::bad_alloc();
    if (isCounting.load(std::memory_order_relaxed)) {
        allocations.fetch_add(1, std::memory_order_relaxed);
        allocatedBytes.fetch_add(usableBytes(memory), std::memory_order_relaxed);
    }
    return memory;
}

void *allocate(std::size_t size) { return counted(std::malloc(size != 0 ? size : 1)); }

void *allocate(std::size_t size, std::align_val_t alignment) {
    const auto step = static_cast<std::size_t>(alignment);
    const std::size_t rounded = (size + step - 1) / step * step;
    return counted(std::aligned_alloc(step, rounded != 0 ? rounded : step));
}

template <typename Allocation> void *withoutThrowing(const Allocation &allocation) noexcept {
    try {
        return allocation();
    } catch (const std::bad_alloc &) {
        return nullptr;
    }
}

void release(void *memory) noexcept {
    if (isCounting.load(std::memory_order_relaxed))
        allocatedBytes.fetch_sub(usableBytes(memory), std::memory_order_relaxed);
    std::free(memory);
}

} // namespace

void *operator new(std::size_t size) { return allocate(size); }
void *operator new[](std::size_t size) { return allocate(size); }
void *operator new(std::size_t size, std::align_val_t alignment) { return allocate(size, alignment); }
void *operator new[](std::size_t size, std::align_val_t alignment) { return allocate(size, alignment); }
// The forms that must not throw. The library's own call the ones above; a sanitizer's do not.
void *operator new(std::size_t size, const std::nothrow_t &) noexcept {
    return withoutThrowing([&] { return allocate(size); });
}
void *operator new[](std::size_t size, const std::nothrow_t &) noexcept {
    return withoutThrowing([&] { return allocate(size); });
}
void *operator new(std::size_t size, std::align_val_t alignment, const std::nothrow_t &) noexcept {
    return withoutThrowing([&] { return allocate(size, alignment); });
}
void *operator new[](std::size_t size, std::align_val_t alignment, const std::nothrow_t &) noexcept {
    return withoutThrowing([&] { return allocate(size, alignment); });
}
void operator delete(void *memory, const std::nothrow_t &) noexcept { release(memory); }
void operator delete[](void *memory, const std::nothrow_t &) noexcept { release(memory); }
void operator delete(void *memory) noexcept { release(memory); }
void operator delete[](void *memory) noexcept { release(memory); }
void operator delete(void *memory, std::size_t) noexcept { release(memory); }
void operator delete[](void *memory, std::size_t) noexcept { release(memory); }
void operator delete(void *memory, std::align_val_t) noexcept { release(memory); }
void operator delete[](void *memory, std::align_val_t) noexcept { release(memory); }
void operator delete(void *memory, std::size_t, std::align_val_t) noexcept { release(memory); }
void operator delete[](void *memory, std::size_t, std::align_val_t) noexcept { release(memory); }

namespace ZorvaTouch::Bench {

AllocationCounter::AllocationCounter() noexcept {
    allocations = 0;
    allocatedBytes = 0;
    isCounting = true;
}

AllocationCounter::~AllocationCounter() { isCounting = false; }

std::uint64_t AllocationCounter::count() const noexcept { return allocations; }
std::int64_t AllocationCounter::bytes() const noexcept { return allocatedBytes; }

} // namespace ZorvaTouch::Bench

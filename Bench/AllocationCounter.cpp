#include "Bench/AllocationCounter.h"

#include <atomic>
#include <cstdlib>
#include <malloc.h>
#include <new>

namespace {

std::atomic<std::uint64_t> allocations{0};
std::atomic<std::uint64_t> bytes{0};

void *allocate(std::size_t size) {
    void *memory = std::malloc(size != 0 ? size : 1);
    if (!memory)
        throw std::bad_alloc();
    allocations.fetch_add(1, std::memory_order_relaxed);
    bytes.fetch_add(malloc_usable_size(memory), std::memory_order_relaxed);
    return memory;
}

void release(void *memory) noexcept {
    bytes.fetch_sub(malloc_usable_size(memory), std::memory_order_relaxed);
    std::free(memory);
}

} // namespace

void *operator new(std::size_t size) { return allocate(size); }
void *operator new[](std::size_t size) { return allocate(size); }
void operator delete(void *memory) noexcept { release(memory); }
void operator delete[](void *memory) noexcept { release(memory); }
void operator delete(void *memory, std::size_t) noexcept { release(memory); }
void operator delete[](void *memory, std::size_t) noexcept { release(memory); }

namespace ZorvaTouch::Bench {

std::uint64_t allocationCount() noexcept { return allocations.load(std::memory_order_relaxed); }
std::uint64_t allocatedBytes() noexcept { return bytes.load(std::memory_order_relaxed); }

} // namespace ZorvaTouch::Bench

#include "Tests/OutOfMemory/Refusal.h"

#include <atomic>
#include <cstddef>
#include <cstdlib>

namespace {

constexpr std::uint64_t kNone = 0;

thread_local bool isCountedThread = false;
std::atomic<bool> isEveryThreadCounted{false};
std::atomic<std::uint64_t> untilRefusal{kNone}; ///< 1: the next one
std::atomic<bool> refusesTheRest{false};
std::atomic<bool> hasRefused{false};

bool isRefused() noexcept {
    if (!isCountedThread && !isEveryThreadCounted)
        return false;
    if (hasRefused && refusesTheRest)
        return true;
    std::uint64_t left = untilRefusal;
    while (left != kNone && !untilRefusal.compare_exchange_weak(left, left - 1)) {
    }
    if (left != 1)
        return false;
    hasRefused = true;
    return true;
}

/// Null if it is refused.
void *allocate(std::size_t size) noexcept {
    return isRefused() ? nullptr : std::malloc(size != 0 ? size : 1);
}

void *allocate(std::size_t size, std::align_val_t alignment) noexcept {
    const auto step = static_cast<std::size_t>(alignment);
    const std::size_t rounded = (size + step - 1) / step * step;
    return isRefused() ? nullptr : std::aligned_alloc(step, rounded != 0 ? rounded : step);
}

void *orThrow(void *memory) {
    if (!memory)
        throw std::bad_alloc();
    return memory;
}

} // namespace

// Also the forms that do not throw: a sanitizer has some of its own, whose memory must not come here.
void *operator new(std::size_t size) { return orThrow(allocate(size)); }
void *operator new[](std::size_t size) { return orThrow(allocate(size)); }
void *operator new(std::size_t size, std::align_val_t alignment) {
    return orThrow(allocate(size, alignment));
}
void *operator new[](std::size_t size, std::align_val_t alignment) {
    return orThrow(allocate(size, alignment));
}
void *operator new(std::size_t size, const std::nothrow_t &) noexcept { return allocate(size); }
void *operator new[](std::size_t size, const std::nothrow_t &) noexcept { return allocate(size); }
void *operator new(std::size_t size, std::align_val_t alignment, const std::nothrow_t &) noexcept {
    return allocate(size, alignment);
}
void *operator new[](std::size_t size, std::align_val_t alignment, const std::nothrow_t &) noexcept {
    return allocate(size, alignment);
}
void operator delete(void *memory) noexcept { std::free(memory); }
void operator delete[](void *memory) noexcept { std::free(memory); }
void operator delete(void *memory, std::size_t) noexcept { std::free(memory); }
void operator delete[](void *memory, std::size_t) noexcept { std::free(memory); }
void operator delete(void *memory, std::align_val_t) noexcept { std::free(memory); }
void operator delete[](void *memory, std::align_val_t) noexcept { std::free(memory); }
void operator delete(void *memory, std::size_t, std::align_val_t) noexcept { std::free(memory); }
void operator delete[](void *memory, std::size_t, std::align_val_t) noexcept { std::free(memory); }
void operator delete(void *memory, const std::nothrow_t &) noexcept { std::free(memory); }
void operator delete[](void *memory, const std::nothrow_t &) noexcept { std::free(memory); }

namespace ZorvaTouch::Testing {

Refusal::InForce::InForce(Refusal &refusal, Threads threads) noexcept : _refusal(refusal) {
    hasRefused = false;
    refusesTheRest = refusal._extent == Extent::AllFromThere;
    untilRefusal = refusal._number;
    isCountedThread = true;
    isEveryThreadCounted = threads == Threads::All;
}

Refusal::InForce::~InForce() {
    isEveryThreadCounted = false;
    isCountedThread = false;
    untilRefusal = kNone;
    _refusal._hasHappened = hasRefused;
}

} // namespace ZorvaTouch::Testing

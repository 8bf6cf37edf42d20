#pragma once

#include <cstddef>
#include <new>

namespace ZorvaTouch::Host {

/// Memory for the one handler of somebody's that a context has at a time, so that handing it over allocates
/// nothing.
class [[gnu::visibility("hidden")]] HandlerMemory {
public:
    [[nodiscard]] void *take(std::size_t size) {
        if (size > sizeof(_bytes))
            throw std::bad_alloc();
        return _bytes;
    }

private:
    alignas(std::max_align_t) std::byte _bytes[192];
};

/// Allocates from a `HandlerMemory`. The memory is given back before the handler is called and taken again
/// only with the next one, so there is nothing to keep account of.
template <typename Value> class [[gnu::visibility("hidden")]] HandlerAllocator {
public:
    using value_type = Value; // NOLINT(readability-identifier-naming): the standard's name

    explicit HandlerAllocator(HandlerMemory & memory) noexcept : _memory(&memory) {}
    template <typename Other>
    HandlerAllocator(const HandlerAllocator<Other> &other) noexcept : _memory(other.memory()) {}

    [[nodiscard]] Value *allocate(std::size_t count) {
        static_assert(alignof(Value) <= alignof(std::max_align_t));
        return static_cast<Value *>(_memory->take(count * sizeof(Value)));
    }
    void deallocate(Value *, std::size_t) noexcept {}
    [[nodiscard]] HandlerMemory *memory() const noexcept { return _memory; }

    template <typename Other> bool operator==(const HandlerAllocator<Other> &other) const noexcept {
        return _memory == other.memory();
    }

private:
    HandlerMemory *_memory;
};

} // namespace ZorvaTouch::Host

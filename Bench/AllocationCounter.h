#pragma once

#include <cstdint>

namespace ZorvaTouch::Bench {

/// Counts what the process allocates through `operator new` while it lives: counted, not estimated.
///
/// A program that links AllocationCounter.cpp has every `operator new` and `delete` replaced. As long as
/// nothing is counted that costs one test of a flag, so that programs which also measure time are not slowed
/// down.
///
/// Threads: at most one at a time; allocations of other threads count as well.
class AllocationCounter {
public:
    AllocationCounter() noexcept; ///< begins to count
    ~AllocationCounter();         ///< and ends
    AllocationCounter(const AllocationCounter &) = delete;
    AllocationCounter &operator=(const AllocationCounter &) = delete;

    /// Allocations so far.
    [[nodiscard]] std::uint64_t count() const noexcept;
    /// Bytes allocated minus bytes released so far, as `malloc_usable_size` gives them. Negative when older
    /// memory has been released.
    [[nodiscard]] std::int64_t bytes() const noexcept;
};

} // namespace ZorvaTouch::Bench

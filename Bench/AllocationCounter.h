#pragma once

#include <cstdint>

namespace ZorvaTouch::Bench {

/// Heap allocations that the process has made through `operator new` so far. Counted, not estimated.
[[nodiscard]] std::uint64_t allocationCount() noexcept;

/// Bytes that are allocated now (as `malloc_usable_size` gives them).
[[nodiscard]] std::uint64_t allocatedBytes() noexcept;

} // namespace ZorvaTouch::Bench

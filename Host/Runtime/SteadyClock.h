#pragma once

#include "Shared/Ports/Clock.h"

#include <cstdint>

namespace ZorvaTouch::Host {

/// The process's monotonic clock. One tick is one nanosecond.
///
/// Threads: any; no state.
class SteadyClock final : public Ports::Clock {
public:
    [[nodiscard]] std::uint64_t nowTicks() noexcept override;
    [[nodiscard]] Ports::TimeBase timeBase() noexcept override { return {.numer = 1, .denom = 1}; }
    /// Sleeps at least that long, signals or not.
    void sleepMicroseconds(std::uint64_t durationUs) noexcept override;
};

} // namespace ZorvaTouch::Host

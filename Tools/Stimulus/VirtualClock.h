#pragma once

#include "Shared/Ports/Clock.h"

#include <cstdint>

namespace ZorvaTouch::Tools {

/// A clock that stands still except while somebody sleeps on it. One tick is one nanosecond.
class VirtualClock final : public Ports::Clock {
public:
    [[nodiscard]] std::uint64_t nowTicks() noexcept override { return _nowNs; }
    [[nodiscard]] Ports::TimeBase timeBase() noexcept override { return {.numer = 1, .denom = 1}; }
    void sleepMicroseconds(std::uint64_t durationUs) noexcept override { _nowNs += durationUs * 1000; }

private:
    std::uint64_t _nowNs = 0;
};

} // namespace ZorvaTouch::Tools

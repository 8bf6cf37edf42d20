#pragma once

#include "Shared/Ports/Clock.h"

#include <cstdint>

namespace ZorvaTouch::Bench {

/// A clock that always shows 0 and never sleeps. One tick is one nanosecond.
class StillClock final : public Ports::Clock {
public:
    [[nodiscard]] std::uint64_t nowTicks() noexcept override { return 0; }
    [[nodiscard]] Ports::TimeBase timeBase() noexcept override { return {1, 1}; }
    void sleepMicroseconds(std::uint64_t) noexcept override {}
};

} // namespace ZorvaTouch::Bench

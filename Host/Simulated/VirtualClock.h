#pragma once

#include "Shared/Ports/Clock.h"
#include "Shared/Util/Ticks.h"

#include <atomic>
#include <cstdint>

namespace ZorvaTouch::Simulated {

/// A clock that stands still until somebody advances it, or sleeps: that takes no time but the clock's.
/// At its end, 2^64-1 ticks, it stands still for ever.
///
/// Threads: any, several at a time.
class VirtualClock final : public Ports::Clock {
public:
    explicit VirtualClock(std::uint64_t startTicks = 0, Ports::TimeBase base = {}) noexcept;

    [[nodiscard]] std::uint64_t nowTicks() noexcept override;
    [[nodiscard]] Ports::TimeBase timeBase() noexcept override { return _base; }
    /// Advances the clock and returns at once. Fractions of ticks are lost.
    void sleepMicroseconds(std::uint64_t durationUs) noexcept override;

    void advanceTicks(std::uint64_t ticks) noexcept;
    /// Advances to a time, if it is still to come: the clock never goes back.
    void advanceToTicks(std::uint64_t ticks) noexcept;
    /// The same with a time in nanoseconds.
    void advanceToNanoseconds(std::uint64_t nanoseconds) noexcept;

private:
    const Ports::TimeBase _base;
    const Util::TickConverter _ticks;
    std::atomic<std::uint64_t> _now;
};

} // namespace ZorvaTouch::Simulated

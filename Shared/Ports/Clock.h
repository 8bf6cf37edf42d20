#pragma once

#include <cstdint>

namespace ZorvaTouch::Ports {

/// Ratio that turns host ticks into nanoseconds: nanoseconds = ticks * numer / denom.
struct TimeBase {
    std::uint32_t numer = 1;
    std::uint32_t denom = 1;
};

/// The host's monotonic tick clock, as much of it as the core needs.
///
/// The core never reads a clock inside an algorithm: live inputs carry their time stamps, and only playback
/// asks for "now" and sleeps.
///
/// Threads:  implementations are called from whichever thread drives the core, one at a time per caller.
class Clock {
public:
    virtual ~Clock() = default;

    /// Current time in host ticks. Monotonic.
    [[nodiscard]] virtual std::uint64_t nowTicks() noexcept = 0;

    /// The tick clock's time base. Constant for the life of the process; a zero `numer` or `denom` is
    /// tolerated.
    [[nodiscard]] virtual TimeBase timeBase() noexcept = 0;

    /// Blocks the calling thread for about `durationUs` microseconds.
    virtual void sleepMicroseconds(std::uint64_t durationUs) noexcept = 0;
};

} // namespace ZorvaTouch::Ports

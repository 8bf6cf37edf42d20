#pragma once

#include "Shared/Ports/Clock.h"

#include <cstdint>

namespace ZorvaTouch::Util {

/// Converts between host ticks and nanoseconds with the clock's time base.
///
/// The time base is read from the clock exactly once, when the converter is made, and never changes
/// afterwards, so a converter can be copied and used from any thread.
///
/// Both directions multiply first, in 64 bits, and truncate. The product wraps on overflow; that is meant, a
/// wider intermediate would give other time stamps than the ones already recorded.
class TickConverter {
public:
    explicit TickConverter(Ports::Clock &clock) noexcept : TickConverter(clock.timeBase()) {}
    constexpr explicit TickConverter(Ports::TimeBase base) noexcept : _base(base) {}

    /// @return Nanoseconds; 0 if the time base's `denom` is 0.
    [[nodiscard]] constexpr std::uint64_t nanosecondsFromMachTime(std::uint64_t ticks) const noexcept {
        return _base.denom == 0 ? 0 : _base.numer * ticks / _base.denom;
    }

    /// @return Host ticks; 0 if the time base's `numer` is 0.
    [[nodiscard]] constexpr std::uint64_t machTimeFromNanoseconds(std::uint64_t nanoseconds) const noexcept {
        return _base.numer == 0 ? 0 : _base.denom * nanoseconds / _base.numer;
    }

private:
    Ports::TimeBase _base;
};

} // namespace ZorvaTouch::Util

#include "Host/Simulated/VirtualClock.h"

#include <algorithm>
#include <limits>

namespace ZorvaTouch::Simulated {
namespace {

constexpr std::uint64_t kEnd = std::numeric_limits<std::uint64_t>::max();

} // namespace

VirtualClock::VirtualClock(std::uint64_t startTicks, Ports::TimeBase base) noexcept
    : _base(base), _ticks(base), _now(startTicks) {}

std::uint64_t VirtualClock::nowTicks() noexcept { return _now.load(); }

void VirtualClock::sleepMicroseconds(std::uint64_t durationUs) noexcept {
    // Longer ones would not fit between the two multiplications; they are centuries.
    const std::uint64_t longestUs = kEnd / 1000 / std::max(_base.denom, 1u);
    advanceTicks(durationUs > longestUs ? kEnd : _ticks.machTimeFromNanoseconds(durationUs * 1000));
}

void VirtualClock::advanceTicks(std::uint64_t ticks) noexcept {
    std::uint64_t now = _now.load();
    while (!_now.compare_exchange_weak(now, now + std::min(ticks, kEnd - now)))
        ;
}

void VirtualClock::advanceToTicks(std::uint64_t ticks) noexcept {
    std::uint64_t now = _now.load();
    while (now < ticks && !_now.compare_exchange_weak(now, ticks))
        ;
}

void VirtualClock::advanceToNanoseconds(std::uint64_t nanoseconds) noexcept {
    advanceToTicks(_ticks.machTimeFromNanoseconds(nanoseconds));
}

} // namespace ZorvaTouch::Simulated

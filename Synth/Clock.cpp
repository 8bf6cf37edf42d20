#include "Synth/Clock.h"

#include <algorithm>

namespace ZorvaTouch::Synth {
namespace {

constexpr double kLargestJitter = 0.45; ///< periods; more could make a measurement overtake the next

} // namespace

void Clock::step() noexcept {
    const double period = 1e6 / _parameters.reportRate; // us
    const double largest = kLargestJitter * period;
    const double jitter = std::clamp(1000 * _parameters.periodJitter * _random.gaussian(), -largest, largest);
    ++_beat;
    _before = _now;
    _now = static_cast<Microseconds>(static_cast<double>(_beat) * period + jitter);
}

void Clock::reset(Microseconds time) noexcept {
    _lastReset = time;
    _hasReset = true;
    _frameNumber = 0;
}

bool Clock::isBooting() const noexcept {
    return _hasReset && _now < _lastReset + microseconds(_parameters.bootTime / 1000);
}

std::uint32_t Clock::sensorMs(Microseconds time) const noexcept {
    return static_cast<std::uint32_t>((time - _lastReset) / 1000);
}

std::uint64_t Clock::hostNs(Microseconds time) noexcept {
    const Microseconds arrival = time + microseconds(_parameters.hostLatency / 1000);
    _lastHostNs = std::max(_lastHostNs, _startNs + arrival * 1000);
    return _lastHostNs;
}

std::uint64_t Clock::reportHostNs(Microseconds time) noexcept {
    return hostNs(time + microseconds(_parameters.hostJitter * _random.uniform() / 1000));
}

} // namespace ZorvaTouch::Synth

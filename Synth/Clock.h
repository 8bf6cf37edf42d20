#pragma once

#include "Synth/Contact.h"
#include "Synth/Parameters.h"
#include "Synth/Random.h"

#include <cstdint>

namespace ZorvaTouch::Synth {

/// When the sensor measures, and how its and the host's clocks show it.
class Clock {
public:
    /// @param startNs     Host time at which the stream begins.
    Clock(std::uint64_t startNs, const Parameters &parameters, Random random) noexcept
        : _parameters(parameters), _random(random), _startNs(startNs) {}

    /// Goes on to the next measurement: an even beat with jitter, that rests while the device boots.
    void step() noexcept;
    /// The time of the measurement.
    [[nodiscard]] Microseconds now() const noexcept { return _now; }
    /// Since the measurement before.
    [[nodiscard]] double stepSeconds() const noexcept { return static_cast<double>(_now - _before) * 1e-6; }

    /// The device starts again, at or before `now`: both its counters from 0.
    void reset(Microseconds time) noexcept;
    [[nodiscard]] bool isBooting() const noexcept;
    /// The time of the last reset, or of the stream's beginning.
    [[nodiscard]] Microseconds lastReset() const noexcept { return _lastReset; }

    /// The sensor's millisecond clock at a time that is not before the last reset.
    [[nodiscard]] std::uint32_t sensorMs(Microseconds time) const noexcept;
    /// The number of the image that is measured now; each call is an image.
    [[nodiscard]] std::uint32_t takeFrameNumber() noexcept { return _frameNumber++; }

    /// Host time at which something that happens at `time` is known: never before that of an earlier call.
    [[nodiscard]] std::uint64_t hostNs(Microseconds time) noexcept;
    /// The same with the jitter of a report on its way.
    [[nodiscard]] std::uint64_t reportHostNs(Microseconds time) noexcept;

private:
    Parameters _parameters;
    Random _random;
    std::uint64_t _startNs;
    std::uint64_t _lastHostNs = 0;
    std::uint64_t _beat = 0; ///< measurements since the stream's beginning, boots counted
    Microseconds _before = 0, _now = 0, _lastReset = 0;
    bool _hasReset = false;
    std::uint32_t _frameNumber = 0;
};

} // namespace ZorvaTouch::Synth

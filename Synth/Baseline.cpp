#include "Synth/Baseline.h"

#include <algorithm>
#include <cmath>

namespace ZorvaTouch::Synth {
namespace {

constexpr double kFirstMean = 8; ///< measurements of which the first baseline is the mean

std::int16_t toSignal(double value) noexcept {
    return static_cast<std::int16_t>(std::clamp(std::floor(value + 0.5), -32768.0, 32767.0));
}

} // namespace

Baseline::Signals Baseline::update(const SensorModel::RawCounts &raw, double seconds) noexcept {
    _measurements = std::min(_measurements + 1, kFirstMean + 1);
    Signals signals{};
    for (std::size_t i = 0; i < kElectrodeCount; ++i) {
        const double before = raw[i] - _levels[i];
        _levels[i] += before * shareOf(before, seconds);
        signals[i] = toSignal(raw[i] - _levels[i]);
    }
    return signals;
}

double Baseline::shareOf(double signal, double seconds) const noexcept {
    if (_measurements <= kFirstMean)
        return 1 / _measurements;
    if (signal > _parameters.touchBand)
        return 0;
    const bool isBelow = signal < -_parameters.touchBand;
    return std::min(seconds / (isBelow ? _parameters.baselineRecovery : _parameters.baselineTime), 1.0);
}

} // namespace ZorvaTouch::Synth

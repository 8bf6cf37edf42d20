#include "Synth/SensorModel.h"

#include "Synth/Electrodes.h"

#include <algorithm>
#include <cmath>

namespace ZorvaTouch::Synth {
namespace {

/// The mean of a blob over a pad, from the middles of its four quarters.
double meanOver(const Pad &pad, const Blob &blob) noexcept {
    double sum = 0;
    for (const double x : {pad.centre.x - pad.width / 4, pad.centre.x + pad.width / 4})
        for (const double y : {pad.centre.y - pad.height / 4, pad.centre.y + pad.height / 4})
            sum += blob.at({.x = x, .y = y});
    return sum / 4;
}

std::uint16_t toCounts(double value) noexcept {
    return static_cast<std::uint16_t>(std::clamp(value + 0.5, 0.0, 65535.0));
}

/// Part of the way to its goal that something goes in `seconds` if it takes `time` for 1 - 1/e of it. A line
/// instead of the exponential curve: `seconds` is small.
double stepOf(double seconds, double time) noexcept { return std::min(seconds / time, 1.0); }

} // namespace

Coverage coverageOf(std::span<const Blob> blobs) noexcept {
    Coverage coverage{};
    for (const Blob &blob : blobs)
        for (const Pad &pad : pads())
            coverage[pad.electrode] += meanOver(pad, blob);
    return coverage;
}

SensorModel::SensorModel(const Parameters &parameters, Random random) noexcept
    : _parameters(parameters), _noise(random.split()) {
    for (std::size_t i = 0; i < kElectrodeCount; ++i) {
        Electrode &electrode = _electrodes[i];
        electrode.gain = sensitivities()[i] * (1 + parameters.gainSpread / 100 * random.gaussian());
        electrode.offset = parameters.offset + parameters.offsetSpread * random.gaussian();
        electrode.drift = parameters.drift * random.gaussian();
    }
}

SensorModel::RawCounts SensorModel::measure(std::span<const Blob> blobs, double seconds) noexcept {
    const Coverage coverage = coverageOf(blobs);
    const double common = _parameters.commonNoise * _noise.gaussian();
    RawCounts counts{};
    for (std::size_t i = 0; i < kElectrodeCount; ++i) {
        Electrode &electrode = _electrodes[i];
        drift(electrode, coverage[i], seconds);
        const double rest = electrode.offset + electrode.drift - _parameters.warmDrift * electrode.warmth;
        const double noise = common + _parameters.noise * _noise.gaussian();
        counts[i] = toCounts(rest + _parameters.signal * electrode.gain * coverage[i] + noise);
    }
    return counts;
}

void SensorModel::drift(Electrode &electrode, double coverage, double seconds) noexcept {
    // A random walk that is drawn back to 0: its variance stays what the parameter says.
    const double back = stepOf(seconds, _parameters.driftTime);
    electrode.drift +=
        _parameters.drift * std::sqrt(back * (2 - back)) * _noise.gaussian() - electrode.drift * back;
    electrode.warmth += (coverage - electrode.warmth) * stepOf(seconds, _parameters.warmTime);
}

} // namespace ZorvaTouch::Synth

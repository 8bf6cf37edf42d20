#pragma once

#include <array>
#include <cstddef>
#include <string_view>

namespace ZorvaTouch::Synth {

/// Everything about finger, sensor and link that can be set. Units, defaults and meanings stand in
/// `parameters()`.
struct Parameters {
    // The link and its clocks
    double reportRate, periodJitter, hostLatency, hostJitter, dropRate, repeatRate, bootTime;
    // Fingers and what else touches
    double signal, fingerWidth, thumbWidth, broadWidth, palmWidth, waterWidth, lightWidth, placement, tremor,
        tremorRate, pauseScale;
    // The sensor
    double gainSpread, noise, commonNoise, drift, driftTime, warmDrift, warmTime, offset, offsetSpread;
    // Its firmware
    double baselineTime, baselineRecovery, touchBand;
    // The accelerometer
    double accelRate, accelNoise, accelBump;

    Parameters() noexcept; ///< the defaults
};

/// What there is to know about one of them.
struct ParameterInfo {
    std::string_view name; ///< as a flag: "report-rate" is --report-rate
    std::string_view unit;
    double standard; ///< the default
    double lowest, highest;
    std::string_view meaning;
    double Parameters::*value;
};

inline constexpr std::size_t kParameterCount = 33;
[[nodiscard]] const std::array<ParameterInfo, kParameterCount> &parameters() noexcept;

} // namespace ZorvaTouch::Synth

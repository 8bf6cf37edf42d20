#include "Shared/Pixel.h"

#include "Shared/Util/Numeric.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch {
namespace {

constexpr float kReleaseRatio =
    0.6f; ///< of the peak (release) or into the valley (entry); single precision throughout

/// Gain of each electrode's channel, unitless. Index order A to O.
constexpr std::array<float, kElectrodeCount> kElectrodeGains{1.9219f, 1.8833f, 1.9281f, 1.8837f, 1.9163f,
                                                             1.8105f, 1.0081f, 1.0f,    1.4851f, 1.5033f,
                                                             2.4154f, 1.5378f, 1.5431f, 1.04f,   1.0493f};

} // namespace

void Pixel::updatePixelState(std::int32_t raw, float activationThreshold) noexcept {
    value = Util::truncateToInt32(gain * static_cast<float>(raw));
    normalizedValue = static_cast<float>(value) / activationThreshold;
    isTouched = isTouched ? normalizedValue > peakValue * kReleaseRatio
                          : normalizedValue > 1.0f && normalizedValue > valleyValue / kReleaseRatio;
    if (isTouched) {
        peakValue = normalizedValue > peakValue ? normalizedValue : peakValue;
        valleyValue = normalizedValue;
        wasTouched = true;
    } else {
        peakValue = normalizedValue;
        valleyValue = normalizedValue < valleyValue ? normalizedValue : valleyValue;
    }
    isAboveFloor = value > kNoiseFloor;
    if (isAboveFloor) {
        wasAboveFloor = true;
        maxNormalizedValue = normalizedValue > maxNormalizedValue ? normalizedValue : maxNormalizedValue;
    }
}

void Pixel::resetGlobalStats() noexcept {
    wasAboveFloor = false;
    wasTouched = false;
    maxNormalizedValue = 0;
}

Pixels makePixels() noexcept {
    return []<std::size_t... I>(std::index_sequence<I...>) {
        return Pixels{Pixel(static_cast<std::int32_t>(I), kElectrodeGains[I])...};
    }
    (std::make_index_sequence<kElectrodeCount>());
}

} // namespace ZorvaTouch

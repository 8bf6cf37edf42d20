#pragma once

#include "Shared/InputReport.h"

#include <array>
#include <cstdint>
#include <string>
#include <string_view>

namespace ZorvaTouch {

/// Region of the sensor that a gesture belongs to; the code travels in the events.
enum PixelRegion : std::uint32_t {
    kPixelRegionNone = 0,
    kPixelRegionPlayPause = 1,  ///< electrodes A to F and K
    kPixelRegionVolumeDown = 2, ///< electrodes L to O
    kPixelRegionVolumeUp = 3,   ///< electrodes G to J
};
inline constexpr std::size_t kPixelRegionCount = 4;

/// Region of an electrode; only the low five bits of the index count.
[[nodiscard]] constexpr PixelRegion regionOfElectrode(std::int32_t index) noexcept {
    const std::uint32_t bit = 1u << (static_cast<std::uint32_t>(index) & 31u);
    if (bit & 0x3C0u)
        return kPixelRegionVolumeUp;
    if (bit & 0x7800u)
        return kPixelRegionVolumeDown;
    if (bit & 0x43Fu)
        return kPixelRegionPlayPause;
    return kPixelRegionNone;
}

/// Scaled values up to this are noise. In scaled sensor counts, independent of the activation threshold.
inline constexpr std::int32_t kNoiseFloor = 75;

/// State of one sensing channel, kept from frame to frame.
struct Pixel {
    Pixel(std::int32_t electrode, float channelGain) noexcept : gain(channelGain), index(electrode) {}

    std::int32_t value = 0;    ///< raw input times `gain`, scaled sensor counts
    float gain;                ///< unitless
    float normalizedValue = 0; ///< `value` in units of the activation threshold
    float peakValue = 0;       ///< touched: largest `normalizedValue` of this touch; else the current one
    float valleyValue = 0;  ///< not touched: smallest `normalizedValue` since release; else the current one
    bool isTouched = false; ///< with hysteresis
    bool isAboveFloor = false;    ///< `value` is above the noise floor in this frame
    bool wasAboveFloor = false;   ///< was above the floor since `resetGlobalStats`
    bool wasTouched = false;      ///< was touched since `resetGlobalStats`
    float maxNormalizedValue = 0; ///< largest `normalizedValue` above the floor since `resetGlobalStats`
    std::int32_t index;           ///< electrode index; for a virtual pixel that of its dominant electrode

    /// Takes one frame's input.
    ///
    /// A channel becomes touched above the activation threshold and 1/0.6 of its lowest value since release,
    /// and is released at 0.6 of the touch's peak. Both comparisons are strict.
    ///
    /// @param raw                  Sensor counts (or their sum), any value.
    /// @param activationThreshold  Scaled sensor counts. 0 and NaN are allowed: a NaN compares false
    /// everywhere.
    ///
    /// Realtime: yes.
    void updatePixelState(std::int32_t raw, float activationThreshold) noexcept;

    [[nodiscard]] PixelRegion getPixelRegion() const noexcept { return regionOfElectrode(index); }

    /// Forgets the sticky statistics (`wasAboveFloor`, `wasTouched`, `maxNormalizedValue`) and nothing else.
    void resetGlobalStats() noexcept;
};

/// A channel made of a group of neighbouring electrodes.
struct VirtualPixel : Pixel {
    /// @param letters  The members' letters, at least one. Copied.
    ///
    /// Until the first frame `index` is the character code of the name's first letter, 65 for 'A', and no
    /// electrode: that is meant and harmless, every frame overwrites it before anything reads it.
    VirtualPixel(std::string_view letters, float channelGain)
        : Pixel(letters.front(), channelGain), name(letters) {}

    std::string name;

    using Pixel::updatePixelState; ///< takes a value and leaves `index` as it is
    /// Takes one frame's sum and the electrode that dominates it.
    void updatePixelState(std::int32_t rawSum, float activationThreshold,
                          std::int32_t dominantIndex) noexcept {
        Pixel::updatePixelState(rawSum, activationThreshold);
        index = dominantIndex;
    }
};

inline constexpr std::size_t kVirtualPixelCount = 23;
inline constexpr std::size_t kChannelCount = kElectrodeCount + kVirtualPixelCount; ///< electrodes and groups

using Pixels = std::array<Pixel, kElectrodeCount>;
using VirtualPixels = std::array<VirtualPixel, kVirtualPixelCount>;

/// The 15 electrodes' channels with their built-in gains, index order A to O.
[[nodiscard]] Pixels makePixels() noexcept;

} // namespace ZorvaTouch

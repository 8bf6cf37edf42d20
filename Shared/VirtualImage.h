#pragma once

#include "Shared/Pixel.h"

#include <array>
#include <cstdint>
#include <span>
#include <string_view>

namespace ZorvaTouch {

/// Sums of neighbouring electrodes, so that a finger between electrodes still gives one strong channel.
class VirtualImage {
public:
    VirtualImage() noexcept;

    /// Sums the members above the noise floor and finds each group's dominant electrode.
    ///
    /// @param pixels  The electrodes' channels after their own update of this frame.
    ///
    /// A group none of whose members is above the floor keeps its dominant electrode, and on ties the one
    /// already recorded stays. Nothing ever resets it; that is meant.
    ///
    /// Realtime: yes.
    void updateValues(const Pixels &pixels) noexcept;

    std::array<std::int32_t, kVirtualPixelCount> values{};  ///< this frame's sums, scaled sensor counts
    std::array<std::string_view, kVirtualPixelCount> names; ///< member letters, "ADEF"
    std::array<std::int32_t, kVirtualPixelCount>
        dominantIndices; ///< electrode index; at first the first member
    std::array<float, kVirtualPixelCount> normalizationFactors; ///< unitless; the virtual pixels' gains

private:
    void updateGroup(std::size_t group, const Pixels &pixels) noexcept;
};

/// Numbers of the two groups around electrode K that decide its region.
inline constexpr std::size_t kVirtualPixelIJK = 18;
inline constexpr std::size_t kVirtualPixelKLM = 19;

/// One virtual pixel per group, in the image's order, with its name and factor.
[[nodiscard]] VirtualPixels makeVirtualPixels(const VirtualImage &image) noexcept;

} // namespace ZorvaTouch

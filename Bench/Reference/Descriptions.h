#pragma once

#include "Bench/Reference/Hand.h"

#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace ZorvaTouch::Reference {

/// One line about the hand, the 15 electrodes and the gesture.
/// @param values  The frame's input, sensor counts.
[[nodiscard]] std::string touchDescription(const Hand &hand, const std::vector<Pixel> &pixels,
                                           std::span<const std::int16_t, kElectrodeCount> values,
                                           std::uint32_t timeMs);

/// The same about the groups.
[[nodiscard]] std::string virtualDescription(const Hand &hand, const std::vector<VirtualPixel> &virtualPixels,
                                             std::uint32_t timeMs);

} // namespace ZorvaTouch::Reference

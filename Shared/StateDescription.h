#pragma once

#include "Shared/HandStats.h"
#include "Shared/Pixel.h"

#include <cstdint>
#include <span>
#include <string>

namespace ZorvaTouch {

/// Describes the hand and the 15 electrodes in one line.
///
/// @param values  The frame's input, sensor counts; shown beside each channel's scaled value.
/// @param timeMs  Frame time; durations of touches in progress are measured to it.
[[nodiscard]] std::string describeTouchState(const HandStats &hand, const Pixels &pixels,
                                             std::span<const std::int16_t, kElectrodeCount> values,
                                             std::uint32_t timeMs);

/// The same with the 23 virtual pixels.
[[nodiscard]] std::string describeVirtualState(const HandStats &hand, const VirtualPixels &virtualPixels,
                                               std::uint32_t timeMs);

} // namespace ZorvaTouch

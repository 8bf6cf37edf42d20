#pragma once

#include "Shared/InputReport.h"

#include <cstddef>
#include <cstdint>
#include <string>

namespace ZorvaTouch::Tools {

/// One line for a terminal: the time, the 15 electrodes with a bar each, and the region that is touched.
///
///     "   3.20 s  A▁ B▆ C  D  E  F  G  H  I  J  K▂ L  M  N  O   play/pause"
///
/// What does not fit is left out: first the region, then the time, then the blanks; below 30 columns all of
/// it.
/// @param columns  That may be used.
[[nodiscard]] std::string electrodeLine(const InputReport::Image &image, std::uint64_t timeNs,
                                        std::size_t columns, bool usesColour);

/// A picture for a terminal: the electrodes at their places on the sensor, each with its letter and a bar,
/// and beside it the time, the region that is touched and a legend, if there are columns for them.
/// @param columns  That may be used.
/// @return 13 lines, the last without a newline; empty if there are fewer columns than `kPictureColumns`.
[[nodiscard]] std::string electrodePicture(const InputReport::Image &image, std::uint64_t timeNs,
                                           std::size_t columns, bool usesColour);

inline constexpr std::size_t kPictureColumns = 36;
inline constexpr std::size_t kPictureRows = 13;

} // namespace ZorvaTouch::Tools

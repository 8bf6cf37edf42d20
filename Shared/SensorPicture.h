#pragma once

#include "Shared/InputReport.h"

#include <span>
#include <string>
#include <string_view>

namespace ZorvaTouch::Util {

/// Where the electrodes are on the sensor, as the finger sees them: 13 rows of 36 characters, spaces and
/// letters. A run of one letter is that electrode's field. Electrodes with two pads (A to F, J and L) appear
/// twice.
[[nodiscard]] std::span<const std::string_view> sensorRows() noexcept;

/// Draws one image as text: a heading with frame number and time, then the electrodes' values at their places
/// on the sensor.
///
/// @param raw  True draws `rawCounts`, false `signals`.
/// @return "# Image frame N    time T ms", an empty line and 13 rows, each ending in a newline. Values of
/// more than
///         four characters push the rest of their row to the right.
[[nodiscard]] std::string stringFromImage(const InputReport::Image &image, bool raw);

} // namespace ZorvaTouch::Util

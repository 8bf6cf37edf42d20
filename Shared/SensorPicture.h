#pragma once

#include "Shared/InputReport.h"

#include <string>

namespace ZorvaTouch::Util {

/// Draws one image as text: a heading with frame number and time, then the electrodes' values at their places
/// on the sensor.
///
/// @param raw  True draws `rawCounts`, false `signals`.
/// @return "# Image frame N    time T ms", an empty line and 13 rows, each ending in a newline. Values of
/// more than
///         four characters push the rest of their row to the right.
[[nodiscard]] std::string stringFromImage(const InputReport::Image &image, bool raw);

} // namespace ZorvaTouch::Util

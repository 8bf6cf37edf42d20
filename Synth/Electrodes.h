#pragma once

#include "Shared/InputReport.h"
#include "Shared/Pixel.h"

#include <array>
#include <cstddef>

namespace ZorvaTouch::Synth {

/// A place on the sensor as the finger sees it: mm from the upper left corner, x to the right, y down.
struct Point {
    double x = 0, y = 0;
};

/// A rectangle of conductor. Electrodes A to F, J and L have two, the others one.
struct Pad {
    std::size_t electrode; ///< 0 = A ... 14 = O
    Point centre;
    double width, height; ///< mm
};

/// How large the sensor picture is (Shared/SensorPicture.h: 36 by 13 characters) in millimetres. A character
/// is about twice as high as it is wide, and so are its millimetres.
inline constexpr double kColumnMm = 0.5;
inline constexpr double kRowMm = 1.0;
inline constexpr double kSensorWidthMm = 36 * kColumnMm;
inline constexpr double kSensorHeightMm = 13 * kRowMm;

inline constexpr std::size_t kPadCount = 23;
[[nodiscard]] const std::array<Pad, kPadCount> &pads() noexcept;

/// Sensor counts of each electrode, where one that needs no gain has 1: the reciprocals of the recognizer's
/// built-in gains, which are there to level the electrodes.
[[nodiscard]] const std::array<double, kElectrodeCount> &sensitivities() noexcept;

/// Where a finger aims that means this region: the mean of its pads' centres.
/// @param region  Not `kPixelRegionNone`.
[[nodiscard]] Point centreOf(PixelRegion region) noexcept;

} // namespace ZorvaTouch::Synth

#pragma once

#include "Shared/FrameList.h"
#include "Shared/InputReport.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

namespace ZorvaTouch::Bench {

/// One image report, report ID first.
using Report = std::array<std::uint8_t, InputReport::Image::kReportLength>;

/// Frames the service keeps at least; it trims at twice as many.
inline constexpr std::size_t kServiceBound = 4350;
/// A recording that is as full as the bound lets it be.
inline constexpr std::size_t kFullRecording = 2 * kServiceBound - 1;

enum class Stimulus {
    Idle,    ///< sensor noise, a few counts
    Touched, ///< a finger that rests on the sensor and moves about it, as in a hold
    Taps,    ///< 120 ms touches, every 500 ms
};

/// `count` reports at 100 per second with ascending frame numbers and times; the same on every machine.
[[nodiscard]] std::vector<Report> makeReports(Stimulus stimulus, std::size_t count);

/// A recording of touches: `count` frames, every 500th a state write.
[[nodiscard]] FrameList makeRecording(std::size_t count);

} // namespace ZorvaTouch::Bench

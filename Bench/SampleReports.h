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

/// Time between two reports: the device sends 100 a second.
inline constexpr std::size_t kReportPeriodMs = 10;

/// Frames the service keeps at least; it trims at twice as many.
inline constexpr std::size_t kServiceBound = 4350;
/// A recording that is as full as the bound lets it be.
inline constexpr std::size_t kFullRecording = 2 * kServiceBound - 1;

/// What the sensor goes through. Every signal has noise of up to 8 counts either way on top.
enum class Stimulus {
    Idle,    ///< nothing
    Resting, ///< a finger that stays in one place: after its hold has begun there is nothing to report
    /// A finger that is down for 990 ms of every second, so that half of the frames come before the hold
    /// time-out and half after it. It covers some six electrodes (420 counts in its middle, 130 less with
    /// each electrode) and moves on by one every 400 ms.
    Touched,
    Taps, ///< the same finger, down for 120 ms of every 500 ms
};

/// `count` reports with ascending frame numbers and times; the same on every machine.
[[nodiscard]] std::vector<Report> makeReports(Stimulus stimulus, std::size_t count);

/// The same, parsed.
[[nodiscard]] std::vector<InputReport::Image> makeImages(Stimulus stimulus, std::size_t count);

/// A recording of `count` reports and nothing else.
[[nodiscard]] FrameList makeReportRecording(Stimulus stimulus, std::size_t count);

/// A recording of taps: `count` frames, every 500th a state write.
[[nodiscard]] FrameList makeRecording(std::size_t count);

} // namespace ZorvaTouch::Bench

#pragma once

#include "Shared/FrameList.h"
#include "Shared/InputReport.h"
#include "Shared/Util/PropertyValue.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <utility>

namespace ZorvaTouch::Tools {

/// An electrode's signal over some reports: from the first report's value to the last one's.
struct Ramp {
    std::int16_t from = 0;
    std::int16_t to = 0;

    /// Signal of report `index` of `count`: from + (to - from) * index / (count - 1) in integers, the
    /// division truncating toward zero; `from` if there is only one report.
    [[nodiscard]] std::int16_t at(std::size_t index, std::size_t count) const noexcept;
};
using Ramps = std::array<Ramp, kElectrodeCount>;

/// A recording in the making: the frames so far, and the clocks of the device and the host.
///
/// Every operation that would exceed the limits of a text throws `LineProblem` and changes nothing.
class StimulusTimeline {
public:
    /// @param maxFrames  Most frames of the recording.
    explicit StimulusTimeline(std::size_t maxFrames) noexcept : _maxFrames(maxFrames) {}

    [[nodiscard]] std::int64_t periodMs() const noexcept { return static_cast<std::int64_t>(_periodMs); }
    void setPeriodMs(std::uint32_t periodMs) noexcept { _periodMs = periodMs; }
    void setSensorClock(std::uint32_t timeMs) noexcept { _sensorTimeMs = timeMs; }
    void setFrameNumber(std::uint32_t number) noexcept { _frameNumber = number; }
    void setRawCounts(const std::array<std::uint16_t, kElectrodeCount> &counts) noexcept {
        _rawCounts = counts;
    }

    /// Adds images, one each period. Each has the time at which it begins; the clocks then move on by a
    /// period and the frame number by one.
    void addImages(const Ramps &ramps, std::size_t count);
    /// Lets time pass on both clocks.
    void wait(std::uint64_t durationMs);
    /// Adds any report. No time passes.
    void addReport(std::span<const std::uint8_t> report);
    /// Adds a state write or a metadata item. No time passes.
    void addKeyed(FrameType type, std::string key, PropertyValue value);

    [[nodiscard]] FrameList takeFrames() noexcept { return std::move(_frames); }

private:
    void requireRoom(std::size_t frameCount) const;
    void requireTime(std::uint64_t durationMs) const;
    void advance(std::uint64_t durationMs) noexcept;
    [[nodiscard]] std::uint64_t timestampNs() const noexcept;

    std::size_t _maxFrames;
    FrameList _frames;
    std::uint64_t _elapsedMs = 0;    ///< host's clock; does not jump with the sensor's
    std::uint32_t _periodMs = 10;    ///< between two reports
    std::uint32_t _sensorTimeMs = 0; ///< of the next image; wraps
    std::uint32_t _frameNumber = 1;  ///< of the next image; wraps
    std::array<std::uint16_t, kElectrodeCount> _rawCounts{};
};

} // namespace ZorvaTouch::Tools

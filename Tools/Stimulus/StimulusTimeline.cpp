#include "Tools/Stimulus/StimulusTimeline.h"

#include "Tools/Stimulus/LineWords.h"
#include "Tools/Stimulus/StimulusText.h"

#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::uint64_t kNanosecondsPerMs = 1'000'000;

} // namespace

std::int16_t Ramp::at(std::size_t index, std::size_t count) const noexcept {
    if (count < 2)
        return from;
    const auto rise = static_cast<std::int64_t>(to) - from;
    const std::int64_t part = rise * static_cast<std::int64_t>(index) / static_cast<std::int64_t>(count - 1);
    return static_cast<std::int16_t>(from + part);
}

void StimulusTimeline::addImages(const Ramps &ramps, std::size_t count) {
    requireRoom(count);
    requireTime(count * _periodMs); // at most 10^6 reports of 10^6 ms
    InputReport::Image image{};
    image.rawCounts = _rawCounts;
    for (std::size_t index = 0; index < count; ++index) {
        image.frameNumber = _frameNumber++;
        image.timeMs = _sensorTimeMs;
        for (std::size_t i = 0; i < kElectrodeCount; ++i)
            image.signals[i] = ramps[i].at(index, count);
        _frames.appendReport(timestampNs(), image.toReport());
        advance(_periodMs);
    }
}

void StimulusTimeline::wait(std::uint64_t durationMs) {
    requireTime(durationMs);
    advance(durationMs);
}

void StimulusTimeline::addReport(std::span<const std::uint8_t> report) {
    requireRoom(1);
    _frames.appendReport(timestampNs(), report);
}

void StimulusTimeline::addKeyed(FrameType type, std::string key, PropertyValue value) {
    requireRoom(1);
    _frames.append({type, timestampNs(), std::move(key), std::move(value), {}});
}

void StimulusTimeline::requireRoom(std::size_t frameCount) const {
    if (frameCount > _maxFrames - _frames.size())
        throw LineProblem("the recording gets more than " + std::to_string(_maxFrames) + " frames");
}

void StimulusTimeline::requireTime(std::uint64_t durationMs) const {
    if (durationMs > kStimulusMaxDurationMs - _elapsedMs)
        throw LineProblem("the recording gets longer than " + std::to_string(kStimulusMaxDurationMs) + "ms");
}

void StimulusTimeline::advance(std::uint64_t durationMs) noexcept {
    _elapsedMs += durationMs;
    _sensorTimeMs += static_cast<std::uint32_t>(durationMs); // modulo 2^32, like the sensor's clock
}

std::uint64_t StimulusTimeline::timestampNs() const noexcept {
    return kStimulusStartNs + _elapsedMs * kNanosecondsPerMs;
}

} // namespace ZorvaTouch::Tools

#include "Bench/SampleReports.h"

#include <algorithm>
#include <cstdlib>

namespace ZorvaTouch::Bench {
namespace {

constexpr int kNoise = 8; // counts, either way
constexpr std::uint64_t kFirstTimestampNs = 1'000'000'000;

/// A small generator of its own: the standard distributions differ between libraries.
class Noise {
public:
    /// From -amplitude to amplitude.
    int next(int amplitude) {
        _state = _state * 6364136223846793005u + 1442695040888963407u;
        const auto bits = static_cast<int>(_state >> 40);
        return bits % (2 * amplitude + 1) - amplitude;
    }

private:
    std::uint64_t _state = 1;
};

bool isPressed(Stimulus stimulus, std::size_t frame) {
    switch (stimulus) {
    case Stimulus::Idle:
        return false;
    case Stimulus::Resting:
        return true;
    case Stimulus::Touched:
        return frame % 100 != 99;
    case Stimulus::Taps:
        return frame % 50 < 12;
    }
    return false;
}

/// Signal of a finger on one electrode.
int fingerSignal(Stimulus stimulus, std::size_t electrode, std::size_t frame) {
    if (!isPressed(stimulus, frame))
        return 0;
    const std::size_t centre = stimulus == Stimulus::Resting ? 2 : frame / 40 % kElectrodeCount;
    const int distance = std::abs(static_cast<int>(electrode) - static_cast<int>(centre));
    return std::max(0, 420 - 130 * distance);
}

std::uint64_t timestampOf(std::size_t frame) {
    return kFirstTimestampNs + frame * kReportPeriodMs * 1'000'000;
}

} // namespace

std::vector<Report> makeReports(Stimulus stimulus, std::size_t count) {
    Noise noise;
    std::vector<Report> reports(count);
    for (std::size_t frame = 0; frame < count; ++frame) {
        InputReport::Image image{};
        image.frameNumber = static_cast<std::uint32_t>(frame);
        image.timeMs = static_cast<std::uint32_t>(frame * kReportPeriodMs);
        for (std::size_t i = 0; i < kElectrodeCount; ++i)
            image.signals[i] =
                static_cast<std::int16_t>(fingerSignal(stimulus, i, frame) + noise.next(kNoise));
        reports[frame] = image.toReport();
    }
    return reports;
}

std::vector<InputReport::Image> makeImages(Stimulus stimulus, std::size_t count) {
    std::vector<InputReport::Image> images;
    images.reserve(count);
    for (const Report &report : makeReports(stimulus, count))
        images.push_back(*InputReport::Image::parse(report.data(), report.size()));
    return images;
}

FrameList makeReportRecording(Stimulus stimulus, std::size_t count) {
    FrameList frames;
    for (const Report &report : makeReports(stimulus, count))
        frames.appendReport(timestampOf(frames.size()), report);
    return frames;
}

FrameList makeRecording(std::size_t count) {
    FrameList frames;
    for (const Report &report : makeReports(Stimulus::Taps, count)) {
        const std::uint64_t timestampNs = timestampOf(frames.size());
        if (frames.size() % 500 == 499)
            frames.append({FrameType::State, timestampNs, "Algs.ActivationThreshold", 200.0, {}});
        else
            frames.appendReport(timestampNs, report);
    }
    return frames;
}

} // namespace ZorvaTouch::Bench

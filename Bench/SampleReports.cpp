#include "Bench/SampleReports.h"

#include "Shared/Util/Bytes.h"

#include <algorithm>
#include <cstdlib>

namespace ZorvaTouch::Bench {
namespace {

constexpr std::size_t kReportPeriodMs = 10;
constexpr std::size_t kSignalsAt = 43;

/// A small generator of its own: the standard distributions differ between libraries.
class Noise {
public:
    /// Evenly from -amplitude to amplitude.
    int next(int amplitude) {
        _state = _state * 6364136223846793005u + 1442695040888963407u;
        const auto bits = static_cast<int>(_state >> 40);
        return bits % (2 * amplitude + 1) - amplitude;
    }

private:
    std::uint64_t _state = 1;
};

bool isPressed(Stimulus stimulus, std::size_t frame) {
    return stimulus == Stimulus::Touched || (stimulus == Stimulus::Taps && frame % 50 < 12);
}

/// Strength of a finger over one electrode: strongest at `centre`, which wanders along the electrodes.
int fingerSignal(std::size_t electrode, std::size_t frame) {
    const auto centre = static_cast<int>(frame / 40 % kElectrodeCount);
    const int distance = std::abs(static_cast<int>(electrode) - centre);
    return std::max(0, 420 - 130 * distance);
}

} // namespace

std::vector<Report> makeReports(Stimulus stimulus, std::size_t count) {
    Noise noise;
    std::vector<Report> reports(count);
    for (std::size_t frame = 0; frame < count; ++frame) {
        Report &report = reports[frame];
        report[0] = InputReport::Image::kReportId;
        Util::storeLittle32(&report[1], static_cast<std::uint32_t>(frame));
        Util::storeLittle32(&report[5], static_cast<std::uint32_t>(frame * kReportPeriodMs));
        for (std::size_t i = 0; i < kElectrodeCount; ++i) {
            const int signal = (isPressed(stimulus, frame) ? fingerSignal(i, frame) : 0) + noise.next(8);
            Util::storeLittle16(&report[kSignalsAt + 2 * i], static_cast<std::uint16_t>(signal));
        }
    }
    return reports;
}

FrameList makeRecording(std::size_t count) {
    FrameList frames;
    std::uint64_t timestampNs = 1'000'000'000;
    for (const Report &report : makeReports(Stimulus::Taps, count)) {
        timestampNs += kReportPeriodMs * 1'000'000;
        if (frames.size() % 500 == 499)
            frames.append({FrameType::State, timestampNs, "Algs.ActivationThreshold", 200.0, {}});
        else
            frames.appendReport(timestampNs, report);
    }
    return frames;
}

} // namespace ZorvaTouch::Bench

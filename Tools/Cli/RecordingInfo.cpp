#include "Tools/Cli/RecordingInfo.h"

#include <algorithm>
#include <numeric>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

/// Follows a replay and fills in what it shows.
class Inspector {
public:
    explicit Inspector(RecordingInfo &info) : _info(info) {}

    void note(const Replay &replay) {
        const ReplayedFrame &frame = replay.frame();
        ++_info.frameCounts[static_cast<std::size_t>(frame.kind)];
        _info.disjointCount += frame.isDisjoint;
        _info.gestures.add(frame);
        noteTime(frame);
        if (frame.kind == InputKind::Image)
            noteImage(frame);
        else if (frame.kind == InputKind::State)
            _info.states.insert_or_assign(std::string(replay.recorded().key), replay.recorded().value);
    }

    void finish() {
        _info.durationNs = _latestNs - _earliestNs;
        if (!_intervalsNs.empty())
            _info.intervals = ImageIntervals::measure(_intervalsNs);
    }

private:
    void noteTime(const ReplayedFrame &frame) {
        _earliestNs = frame.index == 0 ? frame.timestampNs : std::min(_earliestNs, frame.timestampNs);
        _latestNs = std::max(_latestNs, frame.timestampNs);
    }

    void noteImage(const ReplayedFrame &frame) {
        const bool isFirst = _info.countOf(InputKind::Image) == 1;
        if (!isFirst && !frame.isDisjoint)
            _intervalsNs.push_back(static_cast<std::int64_t>(frame.timestampNs - _lastImageNs));
        _lastImageNs = frame.timestampNs;
    }

    RecordingInfo &_info;
    std::uint64_t _earliestNs = 0;
    std::uint64_t _latestNs = 0;
    std::uint64_t _lastImageNs = 0;
    std::vector<std::int64_t> _intervalsNs;
};

} // namespace

ImageIntervals ImageIntervals::measure(std::span<std::int64_t> intervalsNs) {
    std::sort(intervalsNs.begin(), intervalsNs.end());
    ImageIntervals result;
    result.medianNs = intervalsNs[intervalsNs.size() / 2];
    result.longestNs = intervalsNs.back();
    for (std::int64_t &interval : intervalsNs) {
        // Unsigned, as broken time stamps may be further apart than a signed difference can tell.
        const auto difference =
            static_cast<std::uint64_t>(interval) - static_cast<std::uint64_t>(result.medianNs);
        interval = static_cast<std::int64_t>(interval < result.medianNs ? 0 - difference : difference);
    }
    std::sort(intervalsNs.begin(), intervalsNs.end());
    result.jitterNs = intervalsNs[(intervalsNs.size() * 95 + 99) / 100 - 1];
    return result;
}

std::optional<double> ImageIntervals::ratePerSecond() const {
    if (medianNs <= 0)
        return std::nullopt;
    return 1.0e9 / static_cast<double>(medianNs);
}

std::size_t RecordingInfo::frames() const noexcept {
    return std::accumulate(frameCounts.begin(), frameCounts.end(), std::size_t{0});
}

RecordingInfo inspectRecording(RecordingContainer recording, Environment &environment, Progress &progress) {
    RecordingInfo info;
    info.version = recording.version;
    Replay replay(std::move(recording.frames), environment.clock, Ports::silentLogProvider());
    progress.begin("replaying", replay.frames().size());
    Inspector inspector(info);
    while (replay.next()) {
        inspector.note(replay);
        progress.update(replay.frame().index + 1);
    }
    inspector.finish();
    return info;
}

} // namespace ZorvaTouch::Tools

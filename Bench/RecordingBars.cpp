#include "Bench/AllocationCounter.h"
#include "Bench/BarBenchmarks.h"
#include "Bench/Reference/ListRecording.h"
#include "Bench/Rounds.h"
#include "Bench/SampleReports.h"
#include "Bench/StillClock.h"
#include "Shared/FrameList.h"
#include "Shared/PipelineRecording.h"

#include <algorithm>
#include <cstring>

// Full recordings: what they hold, what the append costs that trims them, and what a copy costs.

namespace ZorvaTouch::Bench {
namespace {

constexpr int kTrimRounds = 50;
constexpr int kCopyRounds = 41;
constexpr std::size_t kCopiesPerRound = 32;
constexpr double kReportBytes = 88; // time stamp, length and up to 76 bytes of report

/// The frames of a recording as they come in, over and over, with time going on.
class FrameSource {
public:
    /// The next frame, with everything it needs allocated already.
    Frame next() {
        if (_next == _frames.end())
            _next = _frames.begin();
        Frame frame = (*_next).toFrame();
        ++_next;
        frame.timestampNs = ++_count;
        return frame;
    }

private:
    const FrameList _frames = makeRecording(kFullRecording);
    FrameList::Iterator _next = _frames.begin();
    std::uint64_t _count = 0;
};

bool isSame(const FrameList &frames, const std::list<Frame> &list) {
    return frames.size() == list.size() &&
           std::equal(list.begin(), list.end(), frames.begin(),
                      [](const Frame &left, const FrameView &right) { return left == right.toFrame(); });
}

/// Appends until a recording is trimmed. @return The time that this last append took, in ns.
template <typename Append, typename Size> double trimmingAppendNs(const Append &append, const Size &size) {
    for (;;) {
        const std::size_t before = size();
        const double timeNs = append();
        if (size() <= before)
            return timeNs;
    }
}

/// The append that trims, with state writes among the frames.
void trimmingAppend(benchmark::State &state, BarTable &table) {
    const std::string name = "append that trims, fastest of 50";
    StillClock clock;
    PipelineRecording recording(clock);
    recording.setMaxFrameCount(kServiceBound);
    Reference::ListRecording list(kServiceBound);
    FrameSource recordingSource, listSource;
    const auto appendToRecording = [&] {
        Frame frame = recordingSource.next();
        const double before = wallNs();
        recording.appendFrame(std::move(frame));
        return wallNs() - before;
    };
    const auto appendToList = [&] {
        Frame frame = listSource.next();
        const double before = wallNs();
        list.append(std::move(frame));
        return wallNs() - before;
    };
    const auto recordingSize = [&] { return recording.frames().size(); };
    const auto listSize = [&] { return list.frames().size(); };

    Rounds rounds;
    rounds.run(
        state, [&] { return trimmingAppendNs(appendToRecording, recordingSize); },
        [&] { return trimmingAppendNs(appendToList, listSize); });
    if (!isSame(recording.frames(), list.frames()))
        return reportError(state, table, name, "the trimmed frames differ");
    report(state, table,
           {.name = name,
            .unit = "us",
            .counterpartName = "std::list",
            .figure = rounds.figure.fastest() / 1e3,
            .counterpart = rounds.counterpart.fastest() / 1e3,
            .limit = 0.1});
}

void copyRecording(benchmark::State &state, BarTable &table) {
    const FrameList frames = makeRecording(kFullRecording);
    std::vector<std::uint8_t> bytes;
    for (const FrameView &frame : frames)
        bytes.insert(bytes.end(), frame.data.begin(), frame.data.end());
    std::vector<std::uint8_t> destination(bytes.size());
    const auto perCopy = [](double timeNs) { return timeNs / static_cast<double>(kCopiesPerRound); };

    Rounds rounds;
    rounds.run(
        state,
        [&] {
            return perCopy(cpuTimeOf([&] {
                for (std::size_t i = 0; i < kCopiesPerRound; ++i) {
                    FrameList copy = frames;
                    benchmark::DoNotOptimize(copy);
                }
            }));
        },
        [&] {
            return perCopy(cpuTimeOf([&] {
                for (std::size_t i = 0; i < kCopiesPerRound; ++i) {
                    std::memcpy(destination.data(), bytes.data(), bytes.size());
                    benchmark::ClobberMemory();
                }
            }));
        });
    const FrameList copy = frames;
    if (!std::equal(
            copy.begin(), copy.end(), frames.begin(), frames.end(),
            [](const FrameView &left, const FrameView &right) { return left.toFrame() == right.toFrame(); }))
        return reportError(state, table, "copy of a full recording", "the copy differs");
    report(state, table,
           {.name = "copy of a full recording",
            .unit = "us",
            .counterpartName = "memcpy of its reports",
            .figure = rounds.figure.median() / 1e3,
            .counterpart = rounds.counterpart.median() / 1e3,
            .limit = 2});
}

/// A live recording at its fullest, after it has been trimmed twice.
void memoryPerReport(benchmark::State &state, BarTable &table) {
    StillClock clock;
    const std::vector<Report> reports =
        makeReports(Stimulus::Taps, 2 * kServiceBound + 2 * kServiceBound - 1);
    for (auto _ : state) {
        const AllocationCounter counter;
        PipelineRecording recording(clock);
        recording.setMaxFrameCount(kServiceBound);
        state.SetIterationTime(cpuTimeOf([&] {
                                   for (const Report &report : reports)
                                       recording.handleInputReport(0, report.data(), report.size());
                               }) /
                               1e9);
        const auto bytes = static_cast<double>(counter.bytes()); // before the bar's own texts add to it
        report(state, table,
               {.name = "memory of a kept report",
                .unit = "bytes",
                .counterpartName = "a report's own",
                .figure = bytes / static_cast<double>(recording.frames().size()),
                .counterpart = kReportBytes,
                .limit = 1.6});
    }
}

} // namespace

void registerRecordingBars(BarTable &table) {
    registerBar("bar/trim", kTrimRounds, [&table](benchmark::State &state) { trimmingAppend(state, table); });
    registerBar("bar/copy", kCopyRounds, [&table](benchmark::State &state) { copyRecording(state, table); });
    registerBar("bar/memory", 1, [&table](benchmark::State &state) { memoryPerReport(state, table); });
}

} // namespace ZorvaTouch::Bench

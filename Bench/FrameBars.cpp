#include "Bench/AllocationCounter.h"
#include "Bench/BarBenchmarks.h"
#include "Bench/Reference/RecognizerPair.h"
#include "Bench/Reference/ReferenceRecognizer.h"
#include "Bench/Rounds.h"
#include "Bench/SampleReports.h"
#include "Bench/StillClock.h"
#include "Shared/Algs.h"
#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"

#include <memory>

// The frame step beside the same step as it is first written down, and what it allocates.

namespace ZorvaTouch::Bench {
namespace {

constexpr std::size_t kImageCount = 4000; // 40 s
constexpr int kFrameRounds = 41;
constexpr std::size_t kSteadyReports = 3 * 2 * kServiceBound;

/// Time for one image, in ns.
template <typename AnyRecognizer>
double frameTimeNs(AnyRecognizer &recognizer, const std::vector<InputReport::Image> &images) {
    const double timeNs = cpuTimeOf([&] {
        for (const InputReport::Image &image : images)
            benchmark::DoNotOptimize(recognizer.handleImage(image));
    });
    return timeNs / static_cast<double>(images.size());
}

void frameStep(benchmark::State &state, BarTable &table, Bar bar, Stimulus stimulus) {
    const std::vector<InputReport::Image> images = makeImages(stimulus, kImageCount);
    if (const std::string difference = Reference::differenceOn(images); !difference.empty())
        return reportError(state, table, bar.name, "the recognizers differ: " + difference);

    Algs algs(Ports::silentLogProvider());
    Reference::Recognizer reference;
    Rounds rounds;
    rounds.run(
        state, [&] { return frameTimeNs(algs, images); }, [&] { return frameTimeNs(reference, images); });
    bar.unit = "ns";
    bar.counterpartName = "written straight down";
    bar.figure = rounds.figure.median();
    bar.counterpart = rounds.counterpart.median();
    report(state, table, bar);
}

/// Reports without an event, through a recording at the service's bound and a pipeline.
void steadyState(benchmark::State &state, BarTable &table) {
    StillClock clock;
    PipelineRecording recording(clock);
    recording.pipeline = std::make_shared<Pipeline>(Ports::silentLogProvider());
    recording.setMaxFrameCount(kServiceBound);
    const std::vector<Report> reports = makeReports(Stimulus::Idle, kSteadyReports);
    std::uint64_t now = 0;
    const auto feedAll = [&] {
        for (const Report &report : reports)
            recording.handleInputReport(++now, report.data(), report.size());
    };
    feedAll();
    for (auto _ : state) {
        const AllocationCounter counter;
        state.SetIterationTime(cpuTimeOf(feedAll) / 1e9);
        const auto allocations = static_cast<double>(counter.count()); // before the bar's own texts add to it
        report(state, table,
               {.name = "allocations by reports without an event",
                .counterpartName = "reports",
                .figure = allocations,
                .counterpart = static_cast<double>(reports.size()),
                .sense = Bar::Sense::AtMost,
                .limit = 0,
                .isBinding = true});
    }
}

} // namespace

void registerFrameBars(BarTable &table) {
    registerBar("bar/frame_touched", kFrameRounds, [&table](benchmark::State &state) {
        frameStep(state, table, {.name = "frame step, touched", .limit = 0.45, .stretch = 0.25},
                  Stimulus::Touched);
    });
    registerBar("bar/frame_idle", kFrameRounds, [&table](benchmark::State &state) {
        frameStep(state, table, {.name = "frame step, idle", .limit = 0.30, .stretch = 0.17}, Stimulus::Idle);
    });
    registerBar("bar/allocations", 1, [&table](benchmark::State &state) { steadyState(state, table); });
}

} // namespace ZorvaTouch::Bench

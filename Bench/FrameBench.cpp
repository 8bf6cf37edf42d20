#include "Bench/AllocationCounter.h"
#include "Bench/SampleReports.h"
#include "Bench/StillClock.h"
#include "Shared/Algs.h"
#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"

#include <benchmark/benchmark.h>
#include <memory>

// What one report costs: the model alone, the pipeline, and the pipeline behind a recording at the service's
// bound.

namespace ZorvaTouch::Bench {
namespace {

constexpr std::size_t kReportCount = 4000;

/// Runs `step(report)` over the sample reports, and counts what they allocate.
template <typename Step> void measureReports(benchmark::State &state, Stimulus stimulus, const Step &step) {
    const std::vector<Report> reports = makeReports(stimulus, kReportCount);
    const auto stepAll = [&] {
        for (const Report &report : reports)
            step(report);
    };
    for (int i = 0; i < 4; ++i) // into the steady state
        stepAll();
    std::size_t next = 0;
    for (auto _ : state)
        step(reports[next++ % kReportCount]);

    const AllocationCounter counter;
    stepAll();
    state.counters["allocs"] = static_cast<double>(counter.count()) / kReportCount;
}

void modelAlone(benchmark::State &state, Stimulus stimulus) {
    Algs algs(Ports::silentLogProvider());
    measureReports(state, stimulus, [&algs](const Report &report) {
        const auto image = InputReport::Image::parse(report.data(), report.size());
        benchmark::DoNotOptimize(algs.handleImage(*image));
    });
}

void pipelineAlone(benchmark::State &state, Stimulus stimulus) {
    Pipeline pipeline(Ports::silentLogProvider());
    measureReports(state, stimulus, [&pipeline](const Report &report) {
        pipeline.handleInputReport(0, report.data(), report.size());
    });
}

void pipelineWithRecording(benchmark::State &state, Stimulus stimulus) {
    StillClock clock;
    PipelineRecording recording(clock);
    recording.pipeline = std::make_shared<Pipeline>(Ports::silentLogProvider());
    recording.setMaxFrameCount(kServiceBound);
    std::uint64_t now = 0;
    measureReports(state, stimulus, [&](const Report &report) {
        recording.handleInputReport(now += 10'000'000, report.data(), report.size());
    });
}

BENCHMARK_CAPTURE(modelAlone, idle, Stimulus::Idle);
BENCHMARK_CAPTURE(modelAlone, touched, Stimulus::Touched);
BENCHMARK_CAPTURE(pipelineAlone, idle, Stimulus::Idle);
BENCHMARK_CAPTURE(pipelineAlone, touched, Stimulus::Touched);
BENCHMARK_CAPTURE(pipelineWithRecording, idle, Stimulus::Idle);
BENCHMARK_CAPTURE(pipelineWithRecording, touched, Stimulus::Touched);
BENCHMARK_CAPTURE(pipelineWithRecording, taps, Stimulus::Taps);

} // namespace
} // namespace ZorvaTouch::Bench

#include "Bench/AllocationCounter.h"
#include "Bench/SampleReports.h"
#include "Shared/Algs.h"
#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"
#include "Shared/Ports/Clock.h"

#include <benchmark/benchmark.h>
#include <memory>

// What one report costs: the model alone, the pipeline, and the pipeline behind a recording at the service's
// bound.

namespace ZorvaTouch::Bench {
namespace {

constexpr std::size_t kReportCount = 4096;

class StillClock final : public Ports::Clock {
public:
    std::uint64_t nowTicks() noexcept override { return 0; }
    Ports::TimeBase timeBase() noexcept override { return {1, 1}; }
    void sleepMicroseconds(std::uint64_t) noexcept override {}
};

/// Runs `step(report)` over the sample reports and counts the heap allocations of the measured runs.
template <typename Step> void measureReports(benchmark::State &state, Stimulus stimulus, const Step &step) {
    const std::vector<Report> reports = makeReports(stimulus, kReportCount);
    std::size_t next = 0;
    for (std::size_t i = 0; i < 4 * kReportCount; ++i) // into the steady state
        step(reports[next++ % kReportCount]);
    const std::uint64_t before = allocationCount();
    for (auto _ : state)
        step(reports[next++ % kReportCount]);
    state.counters["allocs"] = benchmark::Counter(static_cast<double>(allocationCount() - before),
                                                  benchmark::Counter::kAvgIterations);
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

#include "Bench/AllocationCounter.h"
#include "Bench/SampleReports.h"
#include "Shared/FrameList.h"
#include "Shared/RecordingContainer.h"

#include <benchmark/benchmark.h>
#include <cstring>
#include <vector>

// What a full recording costs: to keep, to copy, to trim, to write and to read.

namespace ZorvaTouch::Bench {
namespace {

void setBytes(benchmark::State &state, std::size_t bytesPerIteration) {
    state.SetBytesProcessed(static_cast<std::int64_t>(bytesPerIteration) * state.iterations());
}

void memoryPerFrame(benchmark::State &state) {
    std::uint64_t bytes = 0;
    for (auto _ : state) {
        const std::uint64_t before = allocatedBytes();
        const FrameList frames = makeRecording(kFullRecording);
        bytes = allocatedBytes() - before;
    }
    state.counters["bytes/frame"] = static_cast<double>(bytes) / static_cast<double>(kFullRecording);
}

void copyFullRecording(benchmark::State &state) {
    const FrameList frames = makeRecording(kFullRecording);
    for (auto _ : state) {
        FrameList copy = frames;
        benchmark::DoNotOptimize(copy);
    }
}

void memcpyOfTheSameBytes(benchmark::State &state) {
    const std::vector<Report> reports = makeReports(Stimulus::Taps, kFullRecording);
    std::vector<Report> copy(reports.size());
    for (auto _ : state) {
        std::memcpy(copy.data(), reports.data(), reports.size() * sizeof(Report));
        benchmark::ClobberMemory();
    }
    setBytes(state, reports.size() * sizeof(Report));
}

void trimFullRecording(benchmark::State &state) {
    for (auto _ : state) {
        state.PauseTiming();
        FrameList frames = makeRecording(2 * kServiceBound);
        state.ResumeTiming();
        frames.trim(kServiceBound);
        benchmark::DoNotOptimize(frames);
    }
}

void writeContainer(benchmark::State &state) {
    const FrameList frames = makeRecording(kFullRecording);
    std::size_t length = 0;
    for (auto _ : state) {
        const std::string text = writeRecordingContainer(frames);
        length = text.size();
        benchmark::DoNotOptimize(text.data());
    }
    setBytes(state, length);
}

void readContainer(benchmark::State &state) {
    const std::string text = writeRecordingContainer(makeRecording(kFullRecording));
    for (auto _ : state)
        benchmark::DoNotOptimize(readRecordingContainer(text));
    setBytes(state, text.size());
}

BENCHMARK(memoryPerFrame);
BENCHMARK(copyFullRecording)->Unit(benchmark::kMicrosecond);
BENCHMARK(memcpyOfTheSameBytes)->Unit(benchmark::kMicrosecond);
BENCHMARK(trimFullRecording)->Unit(benchmark::kMicrosecond)->Iterations(50);
BENCHMARK(writeContainer)->Unit(benchmark::kMillisecond);
BENCHMARK(readContainer)->Unit(benchmark::kMillisecond);

} // namespace
} // namespace ZorvaTouch::Bench

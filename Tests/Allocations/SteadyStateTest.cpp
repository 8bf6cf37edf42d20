#include "Bench/AllocationCounter.h"
#include "Bench/SampleReports.h"
#include "Bench/StillClock.h"
#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"

#include <gtest/gtest.h>

#include <memory>
#include <new>
#include <span>
#include <vector>

// On the way of a report nothing is allocated unless it makes an event. This program has its own `operator
// new`, which counts.

namespace ZorvaTouch {
namespace {

using Bench::AllocationCounter;
using Bench::kServiceBound;
using Bench::makeReports;
using Bench::Report;
using Bench::Stimulus;

/// Reports until a recording has been trimmed twice: from then on it has all the memory that it needs.
constexpr std::size_t kWarmUpReports = 3 * kServiceBound;
constexpr std::size_t kSteadyReports = 3 * 2 * kServiceBound;

/// A recording at the service's bound, and a pipeline.
class Road {
public:
    Road() {
        const auto pipeline = std::make_shared<Pipeline>(Ports::silentLogProvider());
        pipeline->onHIDEvents = [this](std::uint64_t, const HostEventList &events) {
            _events += events.size();
        };
        _recording.pipeline = pipeline;
        _recording.setMaxFrameCount(kServiceBound);
    }

    template <typename Reports> void feed(const Reports &reports) {
        for (const Report &report : reports)
            _recording.handleInputReport(_now += 10'000'000, report.data(), report.size());
    }

    [[nodiscard]] std::size_t eventCount() const { return _events; }
    [[nodiscard]] std::size_t frameCount() const { return _recording.frames().size(); }

private:
    Bench::StillClock _clock;
    PipelineRecording _recording{_clock};
    std::uint64_t _now = 0;
    std::size_t _events = 0;
};

/// What the steady state's reports allocate.
std::uint64_t steadyStateAllocations(Stimulus stimulus) {
    const std::vector<Report> reports = makeReports(stimulus, kWarmUpReports + kSteadyReports);
    const std::span all(reports);
    Road road;
    road.feed(all.first(kWarmUpReports));
    EXPECT_EQ(road.frameCount(), kServiceBound); // just trimmed
    const std::size_t eventsBefore = road.eventCount();

    const AllocationCounter counter;
    road.feed(all.last(kSteadyReports));
    const std::uint64_t count = counter.count();
    EXPECT_EQ(road.eventCount(), eventsBefore) << "the stimulus is meant to have no event here";
    return count;
}

TEST(Allocations, AReportOfNoiseAllocatesNothing) { EXPECT_EQ(steadyStateAllocations(Stimulus::Idle), 0u); }

TEST(Allocations, AReportOfAFingerAtRestAllocatesNothing) {
    EXPECT_EQ(steadyStateAllocations(Stimulus::Resting), 0u);
}

TEST(Allocations, AreCounted) {
    const AllocationCounter counter;
    EXPECT_EQ(counter.count(), 0u);
    void *const one =
        ::operator new(100); // called by name: a compiler may leave out what an expression allocates
    void *const other = ::operator new[](8);
    EXPECT_EQ(counter.count(), 2u);
    EXPECT_GE(counter.bytes(), 108);
    EXPECT_LT(counter.bytes(), 200); // allocators round up
    ::operator delete(one);
    ::operator delete[](other);
    EXPECT_EQ(counter.count(), 2u);
    EXPECT_EQ(counter.bytes(), 0);
}

} // namespace
} // namespace ZorvaTouch

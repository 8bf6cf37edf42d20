#include "Bench/AllocationCounter.h"
#include "Bench/Latency/RunningService.h"
#include "Bench/SampleReports.h"

#include <gtest/gtest.h>

#include <atomic>

// What the input thread pays for a report without an event: recognition, and nothing of the allocator.

namespace ZorvaTouch {
namespace {

using Bench::AllocationCounter;

class CountingObserver final : public Bench::ReportObserver {
public:
    void reportRead() override {}
    void reportHandled() override {
        _handled.fetch_add(1, std::memory_order_release);
        _handled.notify_one();
    }
    void waitFor(std::size_t reports) const {
        for (std::size_t handled = 0; (handled = _handled.load(std::memory_order_acquire)) < reports;)
            _handled.wait(handled);
    }

private:
    std::atomic<std::size_t> _handled{0};
};

void countEvent(void *target, void *, void *, const ZorvaEvent *, std::uint32_t) {
    static_cast<std::atomic<int> *>(target)->fetch_add(1);
}

TEST(ServiceAllocations, ReportsWithoutAnEventAllocateNothingOnceTheRecordingIsFull) {
    const Bench::Link link;
    CountingObserver observer;
    std::atomic<int> events{0};
    const Bench::RunningService service(link, observer, false, countEvent, &events);
    const auto reports = Bench::makeReports(Bench::Stimulus::Idle, Bench::kFullRecording);
    const auto writeAll = [&] {
        for (const Bench::Report &report : reports)
            link.write(report);
    };
    writeAll();
    writeAll();
    observer.waitFor(2 * reports.size());

    const AllocationCounter counter;
    writeAll();
    observer.waitFor(3 * reports.size());
    EXPECT_EQ(counter.count(), 0U);
    EXPECT_EQ(events, 0);
    link.shutDown();
}

TEST(ServiceAllocations, AnEventIsCounted) { // the counter does see the service's threads
    const Bench::Link link;
    CountingObserver observer;
    std::atomic<int> events{0};
    std::uint64_t allocations = 0;
    {
        const Bench::RunningService service(link, observer, false, countEvent, &events);
        const std::array<std::uint8_t, 10> reset{2, 0};
        const AllocationCounter counter;
        link.write(reset);
        observer.waitFor(1);
        allocations = counter.count();
    }
    EXPECT_GT(allocations, 0U);
    EXPECT_EQ(events, 1);
}

} // namespace
} // namespace ZorvaTouch

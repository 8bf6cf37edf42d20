#include "Bench/AllocationCounter.h"
#include "Bench/Latency/Journey.h"
#include "Bench/Latency/LatencyBars.h"
#include "Bench/Latency/RunningService.h"
#include "Bench/Rounds.h"
#include "Bench/SampleReports.h"

#include <chrono>
#include <optional>
#include <thread>

namespace ZorvaTouch::Bench {
namespace {

constexpr int kRounds = 10;
constexpr unsigned kRateHz = 2'000;
constexpr std::size_t kReportsInARound = 2'000;
constexpr std::size_t kTracePoints = 1'000'000;

/// How long the service's callback took for each report, on the clock on the wall.
class HandlingTimes final : public ReportObserver {
public:
    void reportRead() override { _began = wallNs(); }
    void reportHandled() override {
        if (_times.size() < _times.capacity())
            _times.push_back(wallNs() - _began);
        _handled.fetch_add(1, std::memory_order_release);
        _handled.notify_one();
    }

    /// Forgets what was measured and makes room.
    void begin(std::size_t reports) {
        _times.clear();
        _times.reserve(reports);
        _handled = 0;
    }
    [[nodiscard]] std::vector<double> takeAll(std::size_t reports) {
        for (std::size_t handled = 0; (handled = _handled.load(std::memory_order_acquire)) < reports;)
            _handled.wait(handled);
        return std::move(_times);
    }

private:
    double _began = 0;
    std::vector<double> _times;
    std::atomic<std::size_t> _handled{0};
};

/// Reads the recording again and again while it lives.
class RecordingReader {
public:
    explicit RecordingReader(const RunningService &service)
        : _thread([this, &service] {
              while (!_end.load())
                  static_cast<void>(service.copyProperty("Recording"));
          }) {}
    ~RecordingReader() {
        _end = true;
        _thread.join();
    }
    RecordingReader(const RecordingReader &) = delete;
    RecordingReader &operator=(const RecordingReader &) = delete;

private:
    std::atomic<bool> _end{false};
    std::thread _thread;
};

void write(const Link &link, const std::vector<Report> &reports, unsigned rateHz) {
    const auto period = std::chrono::nanoseconds(1'000'000'000 / rateHz);
    auto next = std::chrono::steady_clock::now();
    for (const Report &report : reports) {
        next += period;
        std::this_thread::sleep_until(next);
        link.write(report);
    }
}

void ignoreEvent(void *, void *, void *, const ZorvaEvent *, std::uint32_t) {}

/// A service in real time whose recording is full, and how long it takes over reports without an event.
class Fixture {
public:
    Fixture() {
        // As fast as they are taken: a link that is full makes its writer wait.
        // Past its first trim, from which on it uses its own memory again.
        times.begin(0);
        for (const Report &report : makeReports(Stimulus::Idle, 2 * kFullRecording))
            link.write(report);
        static_cast<void>(times.takeAll(2 * kFullRecording));
    }
    ~Fixture() { link.shutDown(); }
    Fixture(const Fixture &) = delete;
    Fixture &operator=(const Fixture &) = delete;

    /// The time below which 99 of 100 reports were handled, in ns.
    double p99(const std::vector<Report> &reports) {
        times.begin(reports.size());
        write(link, reports, kRateHz);
        std::vector<double> all = times.takeAll(reports.size());
        return percentile(all, 0.99);
    }

    Link link;
    HandlingTimes times;
    RunningService service{link, times, true, ignoreEvent, nullptr};
};

/// The lock is held for the copy of a recording, not for its text.
void measureReader(BarTable &bars, Fixture &fixture, const std::vector<Report> &reports) {
    Rounds rounds;
    for (int round = 0; round < kRounds; ++round) {
        rounds.counterpart.add(fixture.p99(reports));
        const RecordingReader reader(fixture.service);
        rounds.figure.add(fixture.p99(reports));
    }
    bars.add({.name = "p99 of a report while the recording is read",
              .unit = "us",
              .counterpartName = "with nobody reading",
              .figure = rounds.figure.median() / 1e3,
              .counterpart = rounds.counterpart.median() / 1e3,
              .limit = 5});
}

void measureAllocations(BarTable &bars, Fixture &fixture, const std::vector<Report> &reports) {
    fixture.times.begin(0);
    const AllocationCounter counter;
    for (const Report &report : reports)
        fixture.link.write(report);
    static_cast<void>(fixture.times.takeAll(reports.size()));
    const auto allocations = static_cast<double>(counter.count());
    bars.add({.name = "allocations by reports through the service",
              .counterpartName = "reports",
              .figure = allocations,
              .counterpart = static_cast<double>(reports.size()),
              .limit = 0,
              .isBinding = true});
}

/// One trace point that nobody watches, beside the report that passes it.
void measureTrace(BarTable &bars, Fixture &fixture, const std::vector<Report> &reports) {
    Host::TraceSink &trace = Host::processPlatform().trace();
    Rounds rounds;
    for (int round = 0; round < kRounds; ++round) {
        rounds.figure.add(cpuTimeOf([&] {
                              for (std::size_t point = 0; point < kTracePoints; ++point)
                                  trace.emit(Host::Trace::kInputReport, point, 1, 2, 3);
                          }) /
                          static_cast<double>(kTracePoints));
        fixture.times.begin(reports.size());
        for (const Report &report : reports)
            fixture.link.write(report);
        std::vector<double> all = fixture.times.takeAll(reports.size());
        rounds.counterpart.add(percentile(all, 0.5));
    }
    bars.add({.name = "trace point that nobody watches",
              .unit = "ns",
              .counterpartName = "the report's handling",
              .figure = rounds.figure.median(),
              .counterpart = rounds.counterpart.median(),
              .limit = 0.02});
}

} // namespace

void measureInputThread(BarTable &bars, bool isShort) {
    const std::vector<Report> reports =
        makeReports(Stimulus::Idle, isShort ? kReportsInARound / 10 : kReportsInARound);
    Fixture fixture;
    measureReader(bars, fixture, reports);
    measureAllocations(bars, fixture, makeReports(Stimulus::Idle, kFullRecording));
    measureTrace(bars, fixture, reports);
}

} // namespace ZorvaTouch::Bench

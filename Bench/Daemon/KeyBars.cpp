#include "Bench/Daemon/DaemonBars.h"
#include "Bench/Daemon/KeyChain.h"
#include "Bench/Latency/BusyThread.h"
#include "Bench/Latency/Journey.h"
#include "Bench/Rounds.h"

#include <array>
#include <chrono>
#include <cstdio>
#include <optional>
#include <thread>

namespace ZorvaTouch::Bench {
namespace {

constexpr unsigned kRounds = 10;
constexpr unsigned kRateHz = 1'000;
constexpr std::size_t kReportsInARound = 20 * kReportsForAKey;
constexpr std::size_t kIdleReportsInARound = 2'000;

struct Setting {
    const char *name;
    bool realTime;
    bool busy; ///< the other processor
};

constexpr std::array<Setting, 4> kSettings{{
    {"SCHED_RR 63, idle", true, false},
    {"SCHED_RR 63, busy", true, true},
    {"SCHED_OTHER, idle", false, false},
    {"SCHED_OTHER, busy", false, true},
}};

/// A chain, and the reports that it has yet to get.
class Course {
public:
    using Maker = std::unique_ptr<KeyChain> (*)(const Link &, bool);

    Course(Maker maker, Stimulus stimulus, std::size_t reports, bool realTime)
        : _reports(makeReports(stimulus, reports)), _chain(maker(_link, realTime)) {}
    ~Course() { _link.shutDown(); }
    Course(const Course &) = delete;
    Course &operator=(const Course &) = delete;

    /// Writes so many reports, at times that do not depend on how long anything took, and waits until they
    /// have been read.
    void run(std::size_t count, KeyJourney *journey) {
        const auto period = std::chrono::nanoseconds(1'000'000'000 / kRateHz);
        auto next = std::chrono::steady_clock::now();
        _chain->watch(journey);
        for (const std::size_t end = _next + count; _next < end; ++_next) {
            next += period;
            std::this_thread::sleep_until(next);
            _chain->advanceTo(_next);
            if (journey)
                journey->written(_next);
            _link.write(_reports[_next]);
        }
        _chain->waitForReports(_next);
        std::this_thread::sleep_for(std::chrono::milliseconds(20)); // the last key is on its way
        _chain->watch(nullptr);
    }
    [[nodiscard]] std::size_t next() const noexcept { return _next; }
    [[nodiscard]] double cpuNs() { return _chain->cpuNs(); }

private:
    const std::vector<Report> _reports;
    const Link _link;
    const std::unique_ptr<KeyChain> _chain;
    std::size_t _next = 0;
};

/// All latencies of one chain, and the medians of each round.
struct Latencies {
    std::vector<double> all; ///< ns
    Samples medians, p99s;

    void addRound(Course &course, std::size_t reports) {
        KeyJourney journey(course.next(), reports);
        course.run(reports, &journey);
        std::vector<double> ways = journey.ways();
        all.insert(all.end(), ways.begin(), ways.end());
        if (ways.empty())
            return;
        medians.add(percentile(ways, 0.5));
        p99s.add(percentile(ways, 0.99));
    }
};

struct Pair {
    Latencies daemon, bare;
};

Pair measure(const Setting &setting, std::size_t reports) {
    Pair pair;
    Course daemon(makeDaemonChain, Stimulus::Taps, kRounds * reports, setting.realTime);
    Course bare(makeBareKeyChain, Stimulus::Taps, kRounds * reports, setting.realTime);
    const auto busy = setting.busy ? std::optional<BusyThread>(std::in_place) : std::nullopt;
    for (unsigned round = 0; round < kRounds; ++round) {
        pair.daemon.addRound(daemon, reports);
        pair.bare.addRound(bare, reports);
    }
    return pair;
}

void appendLine(std::string &text, const Setting &setting, const char *what, std::vector<double> &values) {
    std::array<char, 160> line;
    std::snprintf(line.data(), line.size(), "%-20s %-8s %5zu %9.1f %9.1f %9.1f\n", setting.name, what,
                  values.size(), percentile(values, 0.5) / 1e3, percentile(values, 0.99) / 1e3,
                  percentile(values, 1.0) / 1e3);
    text += line.data();
}

void addBars(BarTable &bars, const Setting &setting, const Pair &pair) {
    const auto add = [&](const char *which, const Samples &daemon, const Samples &bare,
                         std::optional<double> limit) {
        bars.add({.name = std::string("report to key, ") + which + ", " + setting.name,
                  .unit = "us",
                  .counterpartName = "bare two threads",
                  .figure = daemon.median() / 1e3,
                  .counterpart = bare.median() / 1e3,
                  .limit = limit});
    };
    add("p50", pair.daemon.medians, pair.bare.medians, 1.3);
    add("p99", pair.daemon.p99s, pair.bare.p99s, setting.realTime ? std::optional(2.0) : std::nullopt);
}

} // namespace

std::string measureKeys(BarTable &bars, bool isShort) {
    std::string text = "report to key, in us                 keys       p50       p99       max\n";
    for (const Setting &setting : kSettings) {
        std::fprintf(stderr, "%s ...\n", setting.name);
        Pair pair = measure(setting, isShort ? kReportsInARound / 10 : kReportsInARound);
        if (pair.daemon.all.empty() || pair.bare.all.empty()) {
            bars.addError(setting.name, "no key was pressed");
            continue;
        }
        appendLine(text, setting, "daemon", pair.daemon.all);
        appendLine(text, setting, "bare", pair.bare.all);
        addBars(bars, setting, pair);
    }
    return text;
}

void measureIdleReports(BarTable &bars, bool isShort) {
    const std::size_t reports = isShort ? kIdleReportsInARound / 10 : kIdleReportsInARound;
    Course daemon(makeDaemonChain, Stimulus::Idle, kRounds * reports, false);
    Course bare(makeBareKeyChain, Stimulus::Idle, kRounds * reports, false);
    const auto cpuOf = [&](Course &course) {
        const double before = course.cpuNs();
        course.run(reports, nullptr);
        return (course.cpuNs() - before) / static_cast<double>(reports);
    };
    Rounds rounds;
    for (unsigned round = 0; round < kRounds; ++round) {
        rounds.figure.add(cpuOf(daemon));
        rounds.counterpart.add(cpuOf(bare));
    }
    bars.add({.name = "processor time of an idle report",
              .unit = "us",
              .counterpartName = "epoll_wait and read",
              .figure = rounds.figure.median() / 1e3,
              .counterpart = rounds.counterpart.median() / 1e3,
              .limit = 1.8});
}

} // namespace ZorvaTouch::Bench

#include "Bench/Latency/LatencyBars.h"

#include "Bench/Latency/BusyThread.h"
#include "Bench/Latency/Chain.h"
#include "Bench/Latency/Link.h"
#include "Bench/Rounds.h"
#include "Shared/InputReport.h"

#include <array>
#include <cstdio>
#include <functional>
#include <optional>
#include <thread>

namespace ZorvaTouch::Bench {

namespace {

constexpr int kRounds = 10;

struct Setting {
    unsigned rateHz;
    std::size_t reports; ///< in a round
    bool realTime;
    bool busy; ///< the other processor
};

constexpr std::array<Setting, 8> kSettings{{
    {100, 100, true, false},
    {100, 100, true, true},
    {100, 100, false, false},
    {100, 100, false, true},
    {10'000, 2'000, true, false},
    {10'000, 2'000, true, true},
    {10'000, 2'000, false, false},
    {10'000, 2'000, false, true},
}};

/// A report that makes an event by itself: the device has reset.
using Report = std::array<std::uint8_t, InputReport::FirmwareEvent::kReportLength>;
constexpr Report kReset{InputReport::FirmwareEvent::kReportId, InputReport::FirmwareEvent::kDeviceReset};

/// Writes one report each period, at times that do not depend on how long anything took.
void writeReports(const Link &link, const Setting &setting, Journey &journey) {
    const auto period = std::chrono::nanoseconds(1'000'000'000 / setting.rateHz);
    auto next = std::chrono::steady_clock::now();
    for (std::size_t report = 0; report < setting.reports; ++report) {
        next += period;
        std::this_thread::sleep_until(next);
        journey.written(report, wallNs());
        link.write(kReset);
    }
}

/// All latencies of one chain in one setting, and the percentiles of each round.
struct Latencies {
    std::vector<double> wholeWays, handOvers; ///< of all rounds, ns
    Samples medians, p99s;                    ///< of the whole ways, by round

    void addRound(const Journey &journey) {
        std::vector<double> round = journey.wholeWays();
        append(wholeWays, round);
        append(handOvers, journey.handOvers());
        medians.add(percentile(round, 0.5));
        p99s.add(percentile(round, 0.99));
    }

private:
    static void append(std::vector<double> &all, const std::vector<double> &round) {
        all.insert(all.end(), round.begin(), round.end());
    }
};

void runRound(const Link &link, Chain &chain, const Setting &setting, Latencies &latencies) {
    Journey journey(setting.reports);
    chain.watch(&journey);
    writeReports(link, setting, journey);
    journey.waitForAll();
    latencies.addRound(journey);
}

struct Pair {
    Latencies service, bare;
};

Pair measure(const Setting &setting) {
    Pair pair;
    const Link serviceLink, bareLink;
    const auto service = makeServiceChain(serviceLink, setting.realTime);
    const auto bare = makeBareChain(bareLink, setting.realTime);
    const std::optional<BusyThread> busy =
        setting.busy ? std::optional<BusyThread>(std::in_place) : std::nullopt;
    for (int round = 0; round < kRounds; ++round) {
        runRound(serviceLink, *service, setting, pair.service);
        runRound(bareLink, *bare, setting, pair.bare);
    }
    bareLink.shutDown();
    serviceLink.shutDown();
    return pair;
}

std::string nameOf(const Setting &setting) {
    std::string name = setting.rateHz == 100 ? "100 Hz" : "10 kHz";
    name += setting.realTime ? ", SCHED_RR 63" : ", SCHED_OTHER";
    return name + (setting.busy ? ", busy" : ", idle");
}

void appendLine(std::string &text, const std::string &name, const char *what, std::vector<double> values) {
    std::array<char, 160> line;
    std::snprintf(line.data(), line.size(), "%-30s %-22s %9.1f %9.1f %9.1f\n", name.c_str(), what,
                  percentile(values, 0.5) / 1e3, percentile(values, 0.99) / 1e3,
                  percentile(values, 0.999) / 1e3);
    text += line.data();
}

void appendTable(std::string &text, const Setting &setting, const Pair &pair) {
    const std::string name = nameOf(setting);
    appendLine(text, name, "service, whole way", pair.service.wholeWays);
    appendLine(text, name, "bare, whole way", pair.bare.wholeWays);
    appendLine(text, name, "service, hand-over", pair.service.handOvers);
    appendLine(text, name, "bare, hand-over", pair.bare.handOvers);
}

/// p50 is promised wherever both run at the same priorities, p99 where they run in real time.
void addBars(BarTable &bars, const Setting &setting, const Pair &pair) {
    const std::string name = nameOf(setting);
    const auto add = [&](const char *which, const Samples &service, const Samples &bare,
                         std::optional<double> limit) {
        bars.add({.name = std::string(which) + ", " + name,
                  .unit = "us",
                  .counterpartName = "bare chain",
                  .figure = service.median() / 1e3,
                  .counterpart = bare.median() / 1e3,
                  .sense = Bar::Sense::AtMost,
                  .limit = limit});
    };
    add("p50", pair.service.medians, pair.bare.medians, 1.3);
    add("p99", pair.service.p99s, pair.bare.p99s, setting.realTime ? std::optional(2.0) : std::nullopt);
}

} // namespace

std::string measureLatencies(BarTable &bars, bool isShort) {
    std::string text =
        "latency in us                  way                          p50       p99     p99.9\n";
    for (Setting setting : kSettings) {
        if (isShort)
            setting.reports /= 10;
        std::fprintf(stderr, "%s ...\n", nameOf(setting).c_str());
        const Pair pair = measure(setting);
        appendTable(text, setting, pair);
        addBars(bars, setting, pair);
    }
    return text;
}

} // namespace ZorvaTouch::Bench

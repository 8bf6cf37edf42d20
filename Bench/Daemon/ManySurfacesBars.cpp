#include "Bench/Daemon/DaemonBars.h"
#include "Bench/Rounds.h"
#include "Host/Runtime/SteadyClock.h"
#include "Host/Runtime/StreamWriter.h"
#include "Synth/Scenario.h"
#include "Tools/Daemon/Daemon.h"

#include <cstddef>
#include <cstdio>
#include <memory>
#include <string_view>

namespace ZorvaTouch::Bench {
namespace {

constexpr std::size_t kMany = 16;
constexpr unsigned kRounds = 3;

/// Takes everything at once.
class NoWriter final : public Host::TextWriter {
public:
    [[nodiscard]] int write(std::string_view) noexcept override { return 0; }
    void giveUp() noexcept override {}
};

/// The whole daemon in this process, to the end of what its fingers do, in ns of processor time.
double cpuNsOf(std::size_t surfaces, double seconds) {
    Tools::SimulatedFinger finger = Tools::fingerOf(*Synth::scenarioNamed("day"));
    finger.seconds = seconds;
    Tools::DaemonOptions options;
    options.devices.assign(surfaces, finger);
    options.showsEvents = true;
    Host::SteadyClock clock;
    const double before = processCpuNs();
    Tools::Daemon daemon(options, {.plugIn = ZORVA_BENCH_PLUGIN,
                                   .logs = Ports::silentLogProvider(),
                                   .clock = clock,
                                   .output = std::make_shared<NoWriter>(),
                                   .keyboard = nullptr,
                                   .finder = nullptr});
    daemon.run();
    return processCpuNs() - before;
}

} // namespace

void measureManySurfaces(BarTable &bars, bool isShort) {
    const double seconds = isShort ? 1 : 10;
    Rounds rounds;
    for (unsigned round = 0; round < kRounds; ++round) {
        std::fprintf(stderr, "many surfaces, %u of %u ...\n", round + 1, kRounds);
        rounds.figure.add(cpuNsOf(kMany, seconds));
        rounds.counterpart.add(cpuNsOf(1, seconds));
    }
    bars.add({.name = "processor time of 16 surfaces",
              .unit = "ms",
              .counterpartName = "one surface",
              .figure = rounds.figure.median() / 1e6,
              .counterpart = rounds.counterpart.median() / 1e6,
              .limit = 20});
}

} // namespace ZorvaTouch::Bench

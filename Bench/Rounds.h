#pragma once

#include "Bench/Bars.h"

#include <benchmark/benchmark.h>

#include <cstddef>
#include <vector>

namespace ZorvaTouch::Bench {

/// Processor time of the calling thread in ns: what other programs take does not count.
[[nodiscard]] double threadCpuNs();
/// Processor time of all threads of this process in ns.
[[nodiscard]] double processCpuNs();
/// A clock on the wall in ns, for what is too short for the other one and for whole processes.
[[nodiscard]] double wallNs();

/// Processor time of one call, in ns.
template <typename Call> [[nodiscard]] double cpuTimeOf(const Call &call) {
    const double before = threadCpuNs();
    call();
    return threadCpuNs() - before;
}

/// Measurements of one thing.
class Samples {
public:
    void add(double value) { _values.push_back(value); }
    [[nodiscard]] double median() const;
    [[nodiscard]] double fastest() const;

private:
    std::vector<double> _values;
};

/// A thing and its counterpart, measured in turn so that what disturbs the one disturbs the other.
struct Rounds {
    Samples figure, counterpart;

    /// Measures both once more for each of the benchmark's iterations; each call returns its own time in ns.
    template <typename Figure, typename Counterpart>
    void run(benchmark::State &state, const Figure &measureFigure, const Counterpart &measureCounterpart) {
        for (auto _ : state) {
            const double timeNs = measureFigure();
            figure.add(timeNs);
            counterpart.add(measureCounterpart());
            state.SetIterationTime(timeNs / 1e9);
        }
    }
};

/// Registers a benchmark that measures one bar in so many rounds.
template <typename Benchmark> void registerBar(const char *name, int rounds, const Benchmark &run) {
    benchmark::RegisterBenchmark(name, run)->Iterations(rounds)->UseManualTime()->Unit(
        benchmark::kMicrosecond);
}

/// Adds the bar to the table and to the benchmark's counters.
void report(benchmark::State &state, BarTable &table, const Bar &bar);
/// Ends a benchmark whose two sides do not do the same.
void reportError(benchmark::State &state, BarTable &table, const std::string &name,
                 const std::string &problem);

} // namespace ZorvaTouch::Bench

#include "Bench/Rounds.h"

#include <algorithm>
#include <ctime>

namespace ZorvaTouch::Bench {
namespace {

double nowNs(clockid_t clock) {
    timespec time{};
    clock_gettime(clock, &time);
    return static_cast<double>(time.tv_sec) * 1e9 + static_cast<double>(time.tv_nsec);
}

} // namespace

double threadCpuNs() { return nowNs(CLOCK_THREAD_CPUTIME_ID); }
double processCpuNs() { return nowNs(CLOCK_PROCESS_CPUTIME_ID); }
double wallNs() { return nowNs(CLOCK_MONOTONIC); }

double Samples::median() const {
    std::vector<double> sorted = _values;
    const auto middle = sorted.begin() + static_cast<std::ptrdiff_t>(sorted.size() / 2);
    std::nth_element(sorted.begin(), middle, sorted.end());
    return *middle;
}

double Samples::fastest() const { return *std::min_element(_values.begin(), _values.end()); }

void report(benchmark::State &state, BarTable &table, const Bar &bar) {
    state.counters["figure"] = bar.figure;
    state.counters["against"] = bar.counterpart;
    state.counters["ratio"] = bar.ratio();
    if (bar.limit) {
        state.counters["limit"] = *bar.limit;
        state.counters["pass"] = bar.passes();
    }
    table.add(bar);
}

void reportError(benchmark::State &state, BarTable &table, const std::string &name,
                 const std::string &problem) {
    state.SkipWithError(problem.c_str());
    table.addError(name, problem);
}

} // namespace ZorvaTouch::Bench

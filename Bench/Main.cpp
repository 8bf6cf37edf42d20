#include "Bench/BarBenchmarks.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <filesystem>
#include <future>
#include <iostream>
#include <thread>

namespace {

/// A thread that does nothing until it is let go. The standard library counts references without atomic
/// operations as long as a process has but one thread, and the daemon has more.
class SecondThread {
public:
    SecondThread() : _thread([end = _end.get_future()]() mutable { end.wait(); }) {}
    ~SecondThread() {
        _end.set_value();
        _thread.join();
    }

private:
    std::promise<void> _end;
    std::thread _thread;
};

/// The command line's program, which is built beside this one.
std::string programBeside() {
    return (std::filesystem::read_symlink("/proc/self/exe").parent_path() / "zorvatouch").string();
}

} // namespace

/// Measures, prints the benchmark library's table and then the table of the bars. The exit code is 1 if
/// results that must be the same differ or if something was allocated that must not be; times never decide
/// it.
int main(int argc, char **argv) {
    using namespace ZorvaTouch;
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 2;

    const SecondThread secondThread;
    Bench::BarTable bars;
    Bench::registerFrameBars(bars);
    Bench::registerRecordingBars(bars);
    Bench::registerContainerBars(bars);
    Bench::registerReplayBar(bars, programBeside());
    Bench::registerHardeningBar(bars, {ZORVA_BENCH_HARDENED, ZORVA_BENCH_PLAIN});
    benchmark::AddCustomContext("compiler", __VERSION__);
    benchmark::RunSpecifiedBenchmarks();
    if (!bars.empty())
        std::cout << '\n' << bars.text();
    return bars.isSound() ? 0 : 1;
}

#include "Bench/BarBenchmarks.h"
#include "Bench/HardeningWork.h"
#include "Bench/Rounds.h"

#include <dlfcn.h>

// What the hardening of optimized builds costs.

namespace ZorvaTouch::Bench {
namespace {

constexpr int kRounds = 21;

using Work = decltype(zorvaBenchWork);

/// The function of one of the two modules, which stays loaded; null if the file does not exist.
Work *load(const std::string &path) {
    void *module = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
    return module == nullptr ? nullptr : reinterpret_cast<Work *>(dlsym(module, "zorvaBenchWork"));
}

void hardening(benchmark::State &state, BarTable &table, const HardeningModules &modules) {
    Bar bar{.name = "hardening, reports and container", .unit = "us", .counterpartName = "without"};
    Work *const hardened = load(modules.hardened);
    Work *const plain = load(modules.plain);
    if (hardened == nullptr || plain == nullptr)
        return reportError(state, table, bar.name, "a module cannot be loaded");
    if (hardened() != plain())
        return reportError(state, table, bar.name, "the two builds differ");

    Rounds rounds;
    rounds.run(
        state, [&] { return cpuTimeOf([&] { benchmark::DoNotOptimize(hardened()); }); },
        [&] { return cpuTimeOf([&] { benchmark::DoNotOptimize(plain()); }); });
    bar.figure = rounds.figure.median() / 1e3;
    bar.counterpart = rounds.counterpart.median() / 1e3;
    report(state, table, bar);
}

} // namespace

void registerHardeningBar(BarTable &table, const HardeningModules &modules) {
    registerBar("bar/hardening", kRounds,
                [&table, modules](benchmark::State &state) { hardening(state, table, modules); });
}

} // namespace ZorvaTouch::Bench

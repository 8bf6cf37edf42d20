#include "Bench/Bars.h"
#include "Bench/Daemon/DaemonBars.h"

#include <cstdio>
#include <cstring>
#include <iostream>

/// Measures how long a report takes to press a key, and what the daemon costs that has nothing to do, and
/// what many surfaces cost. Takes some four minutes; "--short" gives a tenth of the reports, to see that it
/// works.
int main(int argc, char **argv) {
    using namespace ZorvaTouch::Bench;
    const bool isShort = argc == 2 && std::strcmp(argv[1], "--short") == 0;
    if (argc > 1 && !isShort) {
        std::fprintf(stderr, "usage: zorvatouch-bench-daemon [--short]\n");
        return 2;
    }
    BarTable bars;
    std::cout << measureKeys(bars, isShort) << std::flush;
    measureIdleReports(bars, isShort);
    measureIdleDaemon(bars, isShort);
    measureManySurfaces(bars, isShort);
    std::cout << '\n' << bars.text();
    return bars.isSound() ? 0 : 1;
}

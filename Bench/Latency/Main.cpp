#include "Bench/Bars.h"
#include "Bench/Latency/LatencyBars.h"

#include <cstdio>
#include <cstring>
#include <iostream>

/// Measures how long gestures take from the device's node to the host's callback, and what the input thread
/// pays. Takes some two minutes; "--short" gives a tenth of the reports, to see that it works.
int main(int argc, char **argv) {
    using namespace ZorvaTouch::Bench;
    const bool isShort = argc == 2 && std::strcmp(argv[1], "--short") == 0;
    if (argc > 1 && !isShort) {
        std::fprintf(stderr, "usage: zorvatouch-bench-latency [--short]\n");
        return 2;
    }
    BarTable bars;
    std::cout << measureLatencies(bars, isShort) << std::flush;
    measureInputThread(bars, isShort);
    std::cout << '\n' << bars.text();
    return bars.isSound() ? 0 : 1;
}

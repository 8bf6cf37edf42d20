#pragma once

#include "Bench/Bars.h"

#include <string>

namespace ZorvaTouch::Bench {

/// From a report that can be read to the key that it presses, beside a bare chain of two threads.
/// @return A table of the latencies themselves, in us.
[[nodiscard]] std::string measureKeys(BarTable &bars, bool isShort);

/// Processor time of a report that changes nothing, beside a bare wait and read.
void measureIdleReports(BarTable &bars, bool isShort);

/// Memory and wake-ups of the daemon without a surface, beside a program that links the same libraries.
void measureIdleDaemon(BarTable &bars, bool isShort);

/// Processor time of the daemon with 16 simulated surfaces that are touched, beside one.
void measureManySurfaces(BarTable &bars, bool isShort);

} // namespace ZorvaTouch::Bench

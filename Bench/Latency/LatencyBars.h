#pragma once

#include "Bench/Bars.h"

#include <string>

namespace ZorvaTouch::Bench {

/// The way of a gesture, beside a bare chain of the same threads, in every setting.
/// @return A table of the latencies themselves, in us.
[[nodiscard]] std::string measureLatencies(BarTable &bars, bool isShort);

/// What the input thread pays for a report: without an event, with a reader of the recording, for a trace
/// point.
void measureInputThread(BarTable &bars, bool isShort);

} // namespace ZorvaTouch::Bench

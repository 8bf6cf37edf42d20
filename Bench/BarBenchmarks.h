#pragma once

#include "Bench/Bars.h"

#include <string>

/// The benchmarks behind the bars. Each registers with the benchmark library and puts its bars into the table
/// when it has run; it first makes sure that both sides do the same. The table is borrowed until all have
/// run.
namespace ZorvaTouch::Bench {

void registerFrameBars(BarTable &table);
void registerRecordingBars(BarTable &table);
void registerContainerBars(BarTable &table);
/// @param program  The command line's program, to be run as a process of its own.
void registerReplayBar(BarTable &table, const std::string &program);

/// Paths of the two builds of `zorvaBenchWork`.
struct HardeningModules {
    std::string hardened;
    std::string plain;
};
void registerHardeningBar(BarTable &table, const HardeningModules &modules);

} // namespace ZorvaTouch::Bench

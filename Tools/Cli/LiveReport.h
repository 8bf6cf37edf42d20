#pragma once

#include "Shared/FrameList.h"
#include "Tools/Cli/Counters.h"
#include "Tools/Cli/Environment.h"
#include "Tools/Cli/LiveSource.h"
#include "Tools/Hosting/HostedService.h"

#include <cstddef>
#include <string>

/// What the commands that run the service say before and afterwards.
namespace ZorvaTouch::Tools {

/// "simulated finger, scenario day, seed 1811, 20 s"
[[nodiscard]] std::string titleOf(const SimulatedFinger &finger);

/// Writes the line that a run begins with: what is loaded, and what plays.
void writeHeading(const HostedService &service, const std::string &device, Environment &environment);

/// What the service and its host have counted.
[[nodiscard]] Counters readCounters(const HostedService &service, const GestureCounts &gestures);

/// Writes what the service has recorded, and reads it again.
/// @return The recording as it was read.
/// @throws CliError  There is none, or it cannot be written or read.
[[nodiscard]] FrameList saveRecording(const HostedService &service, const std::string &file,
                                      Environment &environment);

/// Input reports in a recording.
[[nodiscard]] std::size_t countReports(const FrameList &recording);

} // namespace ZorvaTouch::Tools

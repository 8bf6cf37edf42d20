#pragma once

#include "Host/Linux/AccelChoice.h"
#include "Host/Linux/DeviceTracker.h"
#include "Tools/Daemon/DaemonOptions.h"

/// What the options mean to the parts that find devices.
namespace ZorvaTouch::Tools {

/// The devices that the system shall be asked for; empty if only simulated ones are wanted.
[[nodiscard]] Linux::DeviceFilter deviceFilterOf(const DaemonOptions &options);

/// Each node that is named is a hidraw device node, or does not exist yet.
/// @throws std::runtime_error  One is something else, which no waiting changes. One line that begins with its
/// path.
void requireNodes(const Linux::DeviceFilter &filter);

/// Whether any surface presses keys: a real one, unless `--no-keys`, or a simulated one with `--keys`.
[[nodiscard]] bool pressesKeys(const DaemonOptions &options);

[[nodiscard]] Linux::AccelChoice accelChoiceOf(const AccelOption &option);

} // namespace ZorvaTouch::Tools

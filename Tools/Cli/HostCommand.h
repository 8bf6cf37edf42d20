#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Cli/ExitStatus.h"
#include "Tools/Cli/Options.h"

namespace ZorvaTouch::Tools {

/// Drives the service as a host does: tells it properties, plays a device, prints what comes out, and asks
/// for properties.
[[nodiscard]] ExitStatus runHost(const HostOptions &options, Environment &environment);

} // namespace ZorvaTouch::Tools

#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Cli/ExitStatus.h"
#include "Tools/Cli/Options.h"

namespace ZorvaTouch::Tools {

/// Shows the service live with a simulated finger, saves what it has recorded, and proves that a replay gives
/// the same events.
[[nodiscard]] ExitStatus runDemo(const DemoOptions &options, Environment &environment);

} // namespace ZorvaTouch::Tools

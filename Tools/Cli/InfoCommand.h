#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Cli/ExitStatus.h"
#include "Tools/Cli/Options.h"

namespace ZorvaTouch::Tools {

/// Says what recordings hold, for a person or as a line of JSON each.
[[nodiscard]] ExitStatus runInfo(const InfoOptions &options, Environment &environment);

} // namespace ZorvaTouch::Tools

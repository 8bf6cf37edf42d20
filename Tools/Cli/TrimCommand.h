#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Cli/ExitStatus.h"
#include "Tools/Cli/Options.h"

namespace ZorvaTouch::Tools {

/// Keeps the newest frames of a recording and the state writes that they need.
[[nodiscard]] ExitStatus runTrim(const TrimOptions &options, Environment &environment);

} // namespace ZorvaTouch::Tools

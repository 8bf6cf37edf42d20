#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Cli/ExitStatus.h"
#include "Tools/Cli/Options.h"

namespace ZorvaTouch::Tools {

/// Writes a recording as a container of the current version, its frames as they are.
[[nodiscard]] ExitStatus runConvert(const ConvertOptions &options, Environment &environment);

} // namespace ZorvaTouch::Tools

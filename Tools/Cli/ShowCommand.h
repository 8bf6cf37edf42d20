#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Cli/ExitStatus.h"
#include "Tools/Cli/Options.h"

namespace ZorvaTouch::Tools {

/// Draws one image of a recording.
[[nodiscard]] ExitStatus runShow(const ShowOptions &options, Environment &environment);

} // namespace ZorvaTouch::Tools

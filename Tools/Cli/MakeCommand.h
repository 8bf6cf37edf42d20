#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Cli/ExitStatus.h"
#include "Tools/Cli/Options.h"

namespace ZorvaTouch::Tools {

/// Makes a recording from its text form.
[[nodiscard]] ExitStatus runMake(const MakeOptions &options, Environment &environment);

} // namespace ZorvaTouch::Tools

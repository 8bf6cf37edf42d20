#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Cli/ExitStatus.h"
#include "Tools/Cli/SynthOptions.h"

namespace ZorvaTouch::Tools {

/// Makes a labelled recording without a device, or lists what it can make.
[[nodiscard]] ExitStatus runSynth(const SynthOptions &options, Environment &environment);

} // namespace ZorvaTouch::Tools

#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Cli/ExitStatus.h"
#include "Tools/Cli/Options.h"

namespace ZorvaTouch::Tools {

/// Plays recordings, each into a fresh pipeline, and prints what comes out, or compares it with what is
/// expected.
[[nodiscard]] ExitStatus runReplay(const ReplayOptions &options, Environment &environment);

} // namespace ZorvaTouch::Tools

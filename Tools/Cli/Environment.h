#pragma once

#include "Shared/Ports/Clock.h"
#include "Shared/Ports/Log.h"
#include "Tools/Cli/Output.h"

#include <functional>
#include <memory>
#include <string>

namespace ZorvaTouch::Tools {

/// What the program has around it: standard streams, time, logs. Tests hand in doubles.
struct Environment {
    std::function<std::string()> readInput; ///< all of standard input; throws Host::FileFailure
    Output output;                          ///< standard output
    Output errorOutput;                     ///< standard error
    Ports::Clock &clock;
    /// Where a replay logs to, from this level on.
    std::function<std::unique_ptr<Ports::LogProvider>(Ports::LogLevel)> openLogs;
    bool usesColour = false;    ///< standard output is a terminal that shows colours and nobody minds
    bool showsProgress = false; ///< standard error is a terminal
};

} // namespace ZorvaTouch::Tools

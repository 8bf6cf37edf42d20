#pragma once

#include "Host/Runtime/Files.h"
#include "Shared/Ports/Clock.h"
#include "Shared/Ports/Log.h"
#include "Tools/Cli/Output.h"

#include <cstddef>
#include <functional>
#include <memory>
#include <string>

namespace ZorvaTouch::Tools {

/// What the program has around it: standard streams, time, logs. Tests hand in doubles.
struct Environment {
    std::function<Host::Input()> openInput; ///< standard input
    Output output;                          ///< standard output
    Output errorOutput;                     ///< standard error
    Ports::Clock &clock;
    /// Where a replay logs to, from this level on.
    std::function<std::unique_ptr<Ports::LogProvider>(Ports::LogLevel)> openLogs;
    bool usesColour = false;    ///< standard output is a terminal that shows colours and nobody minds
    bool showsProgress = false; ///< standard error is a terminal

    // For commands that run the service.

    /// Columns of the terminal that standard output is, if one line of it can be drawn again and again; 0 if
    /// not.
    std::function<std::size_t()> screenColumns = [] { return std::size_t{0}; };
    /// Its rows; 0 if unknown, or not such a terminal.
    std::function<std::size_t()> screenRows = [] { return std::size_t{0}; };
    /// Has `onStop` called, at most once and on any thread, when the user wants an end; until the result is
    /// let go of. Called before other threads are started.
    std::function<std::shared_ptr<void>(std::function<void()> onStop)> watchStop =
        [](const std::function<void()> &) { return nullptr; };
    std::string plugIn = {};      ///< the plug-in's file, unless another is asked for
    std::string stateFolder = {}; ///< for what a user may want to look at later; it need not be there yet
};

} // namespace ZorvaTouch::Tools

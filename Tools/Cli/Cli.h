#pragma once

#include "Tools/Cli/Environment.h"

#include <span>
#include <string>

namespace ZorvaTouch::Tools {

/// Runs the program `zorvatouch`. Docs/CommandLine.md tells what it does.
///
/// @param arguments  Without the program's name.
/// @return The exit status: 0 done, 1 a check that was asked for failed, 2 bad usage or a file that cannot be
/// read or
///         written. With 2 there is one line on standard error. All output has been passed on.
[[nodiscard]] int runCli(std::span<const std::string> arguments, Environment &environment) noexcept;

} // namespace ZorvaTouch::Tools

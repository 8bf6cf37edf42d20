#pragma once

#include "Shared/Ports/Log.h"
#include "Tools/Cli/Options.h"

#include <cstdint>
#include <string>
#include <string_view>

/// Option values from their text. Failures are `CliError`, without a word about help.
namespace ZorvaTouch::Tools {

/// A decimal number of at least `lowest`.
[[nodiscard]] std::uint64_t parseCount(std::string_view option, std::string_view text, std::uint64_t lowest);

/// A speed: a number above 0, or "inf".
[[nodiscard]] float parseSpeed(std::string_view text);

/// "debug", "default" or "error".
[[nodiscard]] Ports::LogLevel parseLogLevel(std::string_view text);

/// KEY=VALUE. The key may begin with the domains "Pipeline." and "Algs."; it must be one that can be written.
/// The value is JSON, or a string if it is none.
[[nodiscard]] Setting parseSetting(std::string_view text);

} // namespace ZorvaTouch::Tools

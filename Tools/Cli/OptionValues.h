#pragma once

#include "Shared/Ports/Log.h"
#include "Synth/Scenario.h"
#include "Tools/Cli/Options.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

/// Option values from their text. Failures are `CliError`, without a word about help.
namespace ZorvaTouch::Tools {

/// A decimal number of at least `lowest`.
[[nodiscard]] std::uint64_t parseCount(std::string_view option, std::string_view text, std::uint64_t lowest);

/// A speed: a number above 0, or "inf".
[[nodiscard]] float parseSpeed(std::string_view text);

/// A number from one limit to the other; their unit is for the message.
[[nodiscard]] double parseQuantity(std::string_view option, std::string_view text, double lowest,
                                   double highest, std::string_view unit);
/// The value of --duration, in seconds: 0.1 to ten hours.
[[nodiscard]] double parseDuration(std::string_view text);

/// The scenarios' names in their order.
[[nodiscard]] std::vector<std::string_view> scenarioNameList();
/// The scenarios' names, "idle, taps, ...".
[[nodiscard]] std::string scenarioNames();
/// A scenario's name. The message has the one that was meant, or lists them all.
[[nodiscard]] const Synth::Scenario &parseScenario(std::string_view option, std::string_view text);

/// A parameter's value as short text, "0.2", "100".
[[nodiscard]] std::string numberText(double value);

/// "debug", "default" or "error".
[[nodiscard]] Ports::LogLevel parseLogLevel(std::string_view text);

/// KEY=VALUE. The key may begin with the domains "Pipeline." and "Algs."; it must be one that can be written,
/// and the value within its range. The value is JSON, or a string if it is not JSON.
[[nodiscard]] Setting parseSetting(std::string_view text);

/// KEY=VALUE for a service. A key "Pipeline.Algs.X" and its value are checked as above; any other key is the
/// device's, and its value is not checked.
[[nodiscard]] Setting parseProperty(std::string_view text);

} // namespace ZorvaTouch::Tools

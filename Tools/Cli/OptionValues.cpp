#include "Tools/Cli/OptionValues.h"

#include "Shared/Algs.h"
#include "Shared/Util/Json.h"
#include "Shared/Util/StateKey.h"
#include "Shared/Util/Text.h"
#include "Tools/Cli/CliError.h"

#include <array>
#include <charconv>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

/// A whole text as a number; false if it is none or out of range.
template <typename Number> bool readNumber(std::string_view text, Number &number) {
    const char *const end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, number);
    return error == std::errc() && stop == end;
}

[[noreturn]] void refuse(std::string_view option, std::string_view text, const std::string &problem) {
    throw CliError(std::string(option) + ": '" + std::string(text) + "' is " + problem);
}

constexpr double kShortestDuration = 0.1;
constexpr double kLongestDuration = 36000; ///< s; ten hours are a gigabyte

struct LogLevelName {
    std::string_view name;
    Ports::LogLevel level;
};
constexpr std::array<LogLevelName, 3> kLogLevelNames{{{"debug", Ports::LogLevel::Debug},
                                                      {"default", Ports::LogLevel::Default},
                                                      {"error", Ports::LogLevel::Error}}};

/// KEY=VALUE, the key as it stands.
Setting splitSetting(std::string_view text) {
    const std::size_t sign = text.find('=');
    if (sign == std::string_view::npos)
        refuse("--set", text, "not KEY=VALUE");
    const std::string_view value = text.substr(sign + 1);
    return {std::string(text.substr(0, sign)), Util::parseJson(value).value_or(PropertyValue(value))};
}

/// The recognizer's key: as the service has it, each domain may be left out.
std::string recognizerKey(std::string_view key) {
    std::string rest(key);
    for (const char *domain : {"Pipeline", "Algs"})
        static_cast<void>(Util::stripDomainFromKey(rest, domain));
    return rest;
}

} // namespace

std::uint64_t parseCount(std::string_view option, std::string_view text, std::uint64_t lowest) {
    std::uint64_t count = 0;
    if (!readNumber(text, count) || count < lowest)
        refuse(option, text, "no whole number from " + std::to_string(lowest) + " on");
    return count;
}

float parseSpeed(std::string_view text) {
    float speed = 0;
    if (!readNumber(text, speed) || !(speed > 0.0f)) // a NaN is refused too
        refuse("--speed", text, "no number above 0");
    return speed;
}

Ports::LogLevel parseLogLevel(std::string_view text) {
    for (const LogLevelName &entry : kLogLevelNames)
        if (entry.name == text)
            return entry.level;
    refuse("--log-level", text, "none of debug, default, error");
}

double parseQuantity(std::string_view option, std::string_view text, double lowest, double highest,
                     std::string_view unit) {
    double value = 0;
    if (!readNumber(text, value) || !(value >= lowest && value <= highest)) // a NaN is refused too
        refuse(option, text,
               "no number from " + numberText(lowest) + " to " + numberText(highest) + " (" +
                   std::string(unit) + ")");
    return value;
}

double parseDuration(std::string_view text) {
    return parseQuantity("--duration", text, kShortestDuration, kLongestDuration, "s");
}

std::string scenarioNames() {
    std::string names;
    for (const Synth::Scenario &scenario : Synth::scenarios())
        names.append(names.empty() ? "" : ", ").append(scenario.name);
    return names;
}

const Synth::Scenario &parseScenario(std::string_view option, std::string_view text) {
    if (const Synth::Scenario *const scenario = Synth::scenarioNamed(text))
        return *scenario;
    refuse(option, text, "no scenario; there are " + scenarioNames());
}

std::string numberText(double value) {
    std::string text;
    Util::appendShortest(text, value);
    return text.ends_with(".0") ? text.substr(0, text.size() - 2) : text;
}

Setting parseSetting(std::string_view text) {
    Setting setting = splitSetting(text);
    const std::string key = std::exchange(setting.key, recognizerKey(setting.key));
    if (!Algs::isWritableKey(setting.key))
        refuse("--set", key, "no state key that can be written");
    return setting;
}

Setting parseProperty(std::string_view text) {
    Setting setting = splitSetting(text);
    if (setting.key.empty())
        refuse("--set", text, "not KEY=VALUE");
    return setting;
}

} // namespace ZorvaTouch::Tools

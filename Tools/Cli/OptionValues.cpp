#include "Tools/Cli/OptionValues.h"

#include "Shared/StateKeys.h"
#include "Shared/Util/Json.h"
#include "Shared/Util/StateKey.h"
#include "Shared/Util/Text.h"
#include "Tools/Cli/CliError.h"
#include "Tools/Cli/Suggestion.h"

#include <array>
#include <charconv>

namespace ZorvaTouch::Tools {
namespace {

/// A whole text as a number; false if it is not one or out of range.
template <typename Number> bool readNumber(std::string_view text, Number &number) {
    const char *const end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, number);
    return error == std::errc() && stop == end;
}

/// @param problem  What follows the value: " must be an integer >= 1".
[[noreturn]] void refuse(std::string_view option, std::string_view text, const std::string &problem) {
    throw CliError(std::string(option) + ": '" + std::string(text) + "'" + problem);
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

constexpr std::string_view kPipelineDomain = "Pipeline";
constexpr std::string_view kRecognizerDomain = "Algs";

/// KEY=VALUE as it was typed; borrowed from the option's text.
struct TypedSetting {
    std::string_view key;
    std::string_view value;

    /// The value as JSON, or else as a text.
    [[nodiscard]] PropertyValue parsedValue() const {
        return Util::parseJson(value).value_or(PropertyValue(value));
    }
};

TypedSetting splitSetting(std::string_view text) {
    const std::size_t sign = text.find('=');
    if (sign == std::string_view::npos)
        refuse("--set", text, " must be KEY=VALUE");
    return {text.substr(0, sign), text.substr(sign + 1)};
}

std::string joined(std::span<const std::string_view> names) {
    std::string text;
    for (const std::string_view name : names)
        text.append(text.empty() ? "" : ", ").append(name);
    return text;
}

/// The recognizer's key: as the service has it, each domain may be left out.
std::string recognizerKey(std::string_view key) {
    std::string rest(key);
    for (const std::string_view domain : {kPipelineDomain, kRecognizerDomain})
        static_cast<void>(Util::stripDomainFromKey(rest, domain));
    return rest;
}

/// The setting with the recognizer's key.
/// @throws CliError  The key cannot be written, or the value is not one for it.
Setting stateSetting(const TypedSetting &typed) {
    Setting setting{recognizerKey(typed.key), typed.parsedValue()};
    const auto range = stateRange(setting.key);
    if (!range)
        refuse("--set", typed.key,
               " is not a writable state key" + suggestion(setting.key, writableStateKeys(),
                                                           "; writable are " + joined(writableStateKeys())));
    if (!range->contains(setting.value))
        refuse("--set " + std::string(typed.key), typed.value, " must be " + range->text());
    return setting;
}

} // namespace

std::uint64_t parseCount(std::string_view option, std::string_view text, std::uint64_t lowest) {
    std::uint64_t count = 0;
    if (!readNumber(text, count) || count < lowest)
        refuse(option, text, " must be an integer >= " + std::to_string(lowest));
    return count;
}

float parseSpeed(std::string_view text) {
    float speed = 0;
    if (!readNumber(text, speed) || !(speed > 0.0f)) // a NaN is refused too
        refuse("--speed", text, " must be a number > 0");
    return speed;
}

Ports::LogLevel parseLogLevel(std::string_view text) {
    for (const LogLevelName &entry : kLogLevelNames)
        if (entry.name == text)
            return entry.level;
    refuse("--log-level", text, " must be debug, default or error");
}

double parseQuantity(std::string_view option, std::string_view text, double lowest, double highest,
                     std::string_view unit) {
    double value = 0;
    if (!readNumber(text, value) || !(value >= lowest && value <= highest)) // a NaN is refused too
        refuse(option, text,
               " must be a number from " + numberText(lowest) + " to " + numberText(highest) + " (" +
                   std::string(unit) + ")");
    return value;
}

double parseDuration(std::string_view text) {
    return parseQuantity("--duration", text, kShortestDuration, kLongestDuration, "s");
}

std::vector<std::string_view> scenarioNameList() {
    std::vector<std::string_view> names;
    for (const Synth::Scenario &scenario : Synth::scenarios())
        names.push_back(scenario.name);
    return names;
}

std::string scenarioNames() { return joined(scenarioNameList()); }

const Synth::Scenario &parseScenario(std::string_view option, std::string_view text) {
    if (const Synth::Scenario *const scenario = Synth::scenarioNamed(text))
        return *scenario;
    refuse(option, text,
           " is not a scenario" + suggestion(text, scenarioNameList(), "; scenarios are " + scenarioNames()));
}

std::string numberText(double value) {
    std::string text;
    Util::appendShortest(text, value);
    return text.ends_with(".0") ? text.substr(0, text.size() - 2) : text;
}

Setting parseSetting(std::string_view text) { return stateSetting(splitSetting(text)); }

Setting parseProperty(std::string_view text) {
    const TypedSetting typed = splitSetting(text);
    if (typed.key.empty())
        refuse("--set", text, " must be KEY=VALUE");
    std::string rest(typed.key);
    if (Util::stripDomainFromKey(rest, kPipelineDomain))
        static_cast<void>(stateSetting(typed));
    else if (stateRange(rest))
        refuse("--set", rest, " is a state key; with its domains it is Pipeline.Algs." + rest);
    return {std::string(typed.key), typed.parsedValue()};
}

} // namespace ZorvaTouch::Tools

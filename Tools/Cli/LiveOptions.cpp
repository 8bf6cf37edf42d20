#include "Tools/Cli/LiveOptions.h"

#include "Tools/Cli/CliError.h"
#include "Tools/Cli/OptionValues.h"

#include <CLI/CLI.hpp>

#include <string_view>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::string_view kFingerPrefix = "sim:";
constexpr std::string_view kRecordingPrefix = "recording:";

// The demo's twenty seconds: with this seed they have taps in all regions, holds that move, a double tap, a
// palm that is rejected, and a graze that is not.
constexpr const char *kDemoScenario = "day";
constexpr const char *kDemoSeed = "1811";
constexpr const char *kDemoDuration = "20";
constexpr double kDemoPauseScale = 0.15; ///< a day in which no time is lost, nor any image

void hurry(Synth::Parameters &parameters) {
    parameters.pauseScale = kDemoPauseScale;
    parameters.dropRate = parameters.repeatRate = 0;
}

void addPlugIn(CLI::App &command, std::optional<std::string> &plugIn) {
    command.add_option("--plugin", plugIn, "The plug-in's file (default: the one beside the program)")
        ->type_name("PATH");
}

} // namespace

void HostArguments::declare(CLI::App &command) {
    addPlugIn(command, _plugIn);
    command.add_option("--device", _device, "What to play: sim:SCENARIO or recording:FILE")
        ->type_name("DEVICE");
    command.add_option("--seed", _seed, "Of sim: the same seed gives the same finger (default: 1)")
        ->type_name("N");
    command.add_option("--duration", _duration, "Of sim: seconds (default: the scenario's)")->type_name("S");
    command
        .add_option("--speed", _speed, "Speed factor, 1 is live (default: inf, virtual time without pauses)")
        ->type_name("X");
    command
        .add_option("--set", _settings,
                    "Set a property first, as --set Pipeline.Algs.ActivationThreshold=250 (may be repeated)")
        ->type_name("KEY=VALUE")
        ->allow_extra_args(false);
    command
        .add_option("--get", _gets,
                    "Get a property afterwards, as --get Pipeline.DebugInfo (may be repeated)")
        ->type_name("KEY")
        ->allow_extra_args(false);
    command.add_option("--save", _save, "Write the service's recording")->type_name("FILE");
    command.add_flag("--json", _json, "Write lines of JSON");
    command
        .add_option("--log-level", _logLevel,
                    "Log to standard error: debug, default or error (default: error)")
        ->type_name("LEVEL");
}

HostOptions HostArguments::read() const {
    HostOptions options;
    options.plugIn = _plugIn;
    readDevice(options);
    if (_speed)
        options.speed = parseSpeed(*_speed);
    for (const std::string &setting : _settings)
        options.settings.push_back(parseProperty(setting));
    options.gets = _gets;
    options.saveFile = _save;
    options.json = _json;
    if (_logLevel)
        options.logLevel = parseLogLevel(*_logLevel);
    if (!_device && _settings.empty() && _gets.empty() && !_save)
        throw CliError("there is nothing to do: --device, --get, --set or --save is required");
    return options;
}

void HostArguments::readDevice(HostOptions &options) const {
    const std::string_view device = _device ? std::string_view(*_device) : std::string_view();
    const bool isFinger = device.starts_with(kFingerPrefix);
    if (isFinger)
        options.device = readFinger(std::string(device.substr(kFingerPrefix.size())));
    else if (device.starts_with(kRecordingPrefix))
        options.device = std::string(device.substr(kRecordingPrefix.size()));
    else if (_device)
        throw CliError("--device: '" + *_device +
                       "' is neither sim:SCENARIO nor recording:FILE; scenarios are " + scenarioNames());
    if (!isFinger && (_seed || _duration))
        throw CliError("--seed and --duration are for --device sim:SCENARIO");
    if (!_device && _speed)
        throw CliError("--speed is for --device");
}

SimulatedFinger HostArguments::readFinger(const std::string &scenario) const {
    SimulatedFinger finger = fingerOf(parseScenario("--device", scenario));
    if (_seed)
        finger.seed = parseCount("--seed", *_seed, 0);
    if (_duration)
        finger.seconds = parseDuration(*_duration);
    return finger;
}

void DemoArguments::declare(CLI::App &command) {
    addPlugIn(command, _plugIn);
    command.add_option("--scenario", _scenario, "What the finger does (default: day, with short pauses)")
        ->type_name("NAME");
    command.add_option("--seed", _seed, "The same seed gives the same finger (default: 1811)")
        ->type_name("N");
    command.add_option("--duration", _duration, "Seconds (default: 20)")->type_name("S");
    command.add_flag("--forever", _forever, "Run until Ctrl-C");
    command.add_option("--speed", _speed, "Speed factor, 1 is live, inf has no pauses (default: 1)")
        ->type_name("X");
    command.add_flag("--quiet", _quiet, "Show only the summary");
    command.add_flag("--json", _json, "Write lines of JSON");
    command
        .add_option("--save", _save,
                    "Where to write the recording (default: zorvatouch-demo.json below XDG_STATE_HOME)")
        ->type_name("FILE");
}

DemoOptions DemoArguments::read() const {
    if (_forever && _duration)
        throw CliError("--forever and --duration exclude each other");
    DemoOptions options;
    options.plugIn = _plugIn;
    options.finger = fingerOf(parseScenario("--scenario", _scenario.value_or(kDemoScenario)));
    if (options.finger.scenario->name == kDemoScenario)
        hurry(options.finger.parameters);
    options.finger.seed = parseCount("--seed", _seed.value_or(kDemoSeed), 0);
    options.finger.seconds = parseDuration(_duration.value_or(kDemoDuration));
    if (_forever)
        options.finger.seconds.reset();
    if (_speed)
        options.speed = parseSpeed(*_speed);
    options.quiet = _quiet;
    options.json = _json;
    options.saveFile = _save;
    return options;
}

} // namespace ZorvaTouch::Tools

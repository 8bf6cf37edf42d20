#include "Tools/Daemon/DaemonOptions.h"

#include "Shared/Util/Text.h"
#include "Tools/Cli/CliError.h"
#include "Tools/Cli/HelpFormatter.h"
#include "Tools/Cli/OptionValues.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <memory>
#include <string_view>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr const char *kProgram = "zorvatouchd";
constexpr const char *kHint = " (see zorvatouchd --help)";
constexpr std::size_t kMostRecordings = 1000; ///< each name is checked at the start
constexpr std::string_view kFingerPrefix = "sim:";

constexpr const char *kDescription =
    "Turns touches of the touch surface into media keys: taps play, pause and\n"
    "change the volume, holds repeat. Runs until a signal; supports hot-plug.\n";

constexpr const char *kFooter = R"(
Examples:
  zorvatouchd
  zorvatouchd --no-keys
  zorvatouchd --device sim:day --duration 20
  zorvatouchd --id 1234:ABCD --id 1234:ABCF
  zorvatouchd --map hold:play-pause=KEY_MICMUTE --map tap:volume-up=none
  zorvatouchd --events json --save touch.json
  zorvatouchd --describe > report.json

Signals:
  SIGTERM, SIGINT, SIGHUP  let go of all keys, save, and end
  SIGUSR1                  save the recording now, and go on

Exit status:
  0    ended by a signal, or with the simulated finger
  1    the plug-in cannot be loaded, nothing can work, or a recording was lost
  2    bad usage
  3    another program uses a surface, as a second zorvatouchd does; see --wait
  141  the reader of a pipe has closed it (--help, --version, --describe)
)";

[[noreturn]] void refuse(std::string_view option, std::string_view text, const std::string &problem) {
    throw CliError(std::string(option) + ": '" + std::string(text) + "'" + problem);
}

/// One to four hexadecimal digits.
std::optional<std::uint16_t> hexNumber(std::string_view text) {
    std::uint16_t number = 0;
    const char *const end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, number, 16);
    if (text.size() > 4 || error != std::errc() || stop != end)
        return std::nullopt;
    return number;
}

Linux::HidId parseId(std::string_view text) {
    const std::size_t colon = text.find(':');
    if (colon != std::string_view::npos) {
        const auto vendor = hexNumber(text.substr(0, colon));
        const auto product = hexNumber(text.substr(colon + 1));
        if (vendor && product)
            return {*vendor, *product};
    }
    refuse("--id", text, " must be VENDOR:PRODUCT in hexadecimal digits, at most four each, as 1234:ABCD");
}

AccelOption parseAccel(const std::string &text) {
    if (text == "auto")
        return {};
    if (text == "none")
        return {AccelOption::Choice::None, {}};
    if (text.empty())
        refuse("--accel", text, " must be auto, none or the name of an accelerometer");
    return {AccelOption::Choice::Named, text};
}

void requireFileName(std::string_view option, const std::string &name) {
    if (name.empty() || name == "-" || name.ends_with('/'))
        refuse(option, name, " is not the name of a file");
}

template <typename Value>
void requireOnce(std::string_view option, const std::vector<Value> &values, const Value &value,
                 const std::string &text) {
    if (std::find(values.begin(), values.end(), value) != values.end())
        refuse(option, text, " is given twice");
}

/// The scenarios' names in lines, each but the first after `indent`.
std::string brokenScenarioNames(std::string_view indent) {
    constexpr std::size_t kLongestLine = 40;
    std::string text;
    std::size_t length = 0;
    for (const Synth::Scenario &scenario : Synth::scenarios()) {
        if (!text.empty()) {
            const bool fits = length + 2 + scenario.name.size() <= kLongestLine;
            text.append(fits ? ", " : ",\n").append(fits ? "" : indent);
            length = fits ? length + 2 : 0;
        }
        text.append(scenario.name);
        length += scenario.name.size();
    }
    return text;
}

/// Declares the options: they are kept as text, and read once they are all there.
class DaemonCommandLine {
public:
    DaemonCommandLine() : _app(kDescription, kProgram) {
        _app.formatter(std::make_shared<HelpFormatter>(24));
        _app.footer(kFooter);
        _app.set_help_flag(); // to be declared again, so that its group comes last
        declareDevices();
        declareKeys();
        declareOutput();
        declareOther();
    }

    [[nodiscard]] DaemonCommand parse(std::span<const std::string> arguments) {
        try {
            _app.parse(std::vector<std::string>(arguments.rbegin(), arguments.rend())); // from last to first
            return read();
        } catch (const CLI::CallForHelp &) {
            return AnswerOptions{_app.help()};
        } catch (const CLI::CallForVersion &) {
            return AnswerOptions{_app.version() + "\n"};
        } catch (const CLI::ParseError &error) {
            throw CliError(Util::printable(parseProblem(error)) + kHint);
        } catch (const CliError &error) {
            throw CliError(Util::printable(error.what()) + kHint);
        }
    }

private:
    /// What the library found wrong, in our words where its own are unclear.
    [[nodiscard]] std::string parseProblem(const CLI::ParseError &error) const {
        const std::vector<std::string> extras = _app.remaining();
        if (!extras.empty())
            return extras.front().starts_with('-') ? unknownOption(extras.front(), _app)
                                                   : "unexpected argument '" + extras.front() + "'";
        const std::vector<const CLI::Option *> repeated = _app.get_options(
            [](const CLI::Option *option) { return option->get_expected_max() <= 1 && option->count() > 1; });
        if (!repeated.empty())
            return repeated.front()->get_name() + " may be given only once";
        return error.what();
    }

    CLI::Option &addOption(const char *group, const char *name, std::optional<std::string> &value,
                           const char *type, const std::string &description) {
        return *_app.add_option(name, value, description)->type_name(type)->group(group);
    }
    void addOptions(const char *group, const char *name, std::vector<std::string> &values, const char *type,
                    const std::string &description) {
        _app.add_option(name, values, description)->type_name(type)->group(group)->allow_extra_args(false);
    }
    void addFlag(const char *group, const char *name, bool &value, const char *description) {
        _app.add_flag(name, value, description)
            ->group(group)
            ->multi_option_policy(CLI::MultiOptionPolicy::Throw);
    }

    // Descriptions are broken by hand: the library does not, and indents what follows.

    void declareDevices() {
        constexpr const char *kGroup = "Surfaces";
        addOptions(kGroup, "--device", _devices, "DEVICE",
                   "Use this one, and look for no other (may be repeated)\n"
                   "/dev/hidraw0  the path of a surface's node\n"
                   "sim:SCENARIO  a simulated finger, which needs no hardware:\n"
                   "              " +
                       brokenScenarioNames("              "));
        addOption(kGroup, "--seed", _seed, "N", "Of sim: the same seed gives the same finger (default: 1)");
        addOption(kGroup, "--duration", _duration, "S",
                  "Of sim: end after this many seconds (default: no end)");
        addOptions(kGroup, "--id", _ids, "VENDOR:PRODUCT",
                   "Look for this make, in hexadecimal digits (may be repeated; default: 1234:ABCD)");
        addFlag(kGroup, "--wait", _wait, "Wait for surfaces that another daemon uses");
        addOption(kGroup, "--accel", _accel, "NAME",
                  "Which accelerometer to use (default: auto)\n"
                  "auto          any that is present\n"
                  "none          do without one\n"
                  "NAME          the one of that name, label or node");
    }

    void declareKeys() {
        constexpr const char *kGroup = "Keys";
        addOptions(kGroup, "--map", _maps, "MAPPING",
                   "Press another key: GESTURE:REGION=KEY (may be repeated)\n"
                   "GESTURE       tap, hold\n"
                   "REGION        play-pause, volume-down, volume-up\n"
                   "KEY           the kernel's name, as KEY_NEXTSONG; or none");
        declareKeyLimit(kGroup);
        addFlag(kGroup, "--no-keys", _noKeys, "Show the keys instead of pressing them");
        addFlag(kGroup, "--keys", _keys, "Press the keys of simulated surfaces, too (default: show them)");
    }

    void declareKeyLimit(const char *group) {
        addOption(group, "--key-limit", _keyLimit, "N",
                  "Suspend the keys of a surface that makes more presses\n"
                  "per second than this (default: " +
                      std::to_string(KeyQuarantine::kDefaultLimit) + "; 0: no limit)");
    }

    void declareOutput() {
        constexpr const char *kGroup = "Output";
        addOption(kGroup, "--events", _events, "FORMAT",
                  "Write events to standard output (default: for people)\n"
                  "json          a line of JSON for each event");
        addOption(kGroup, "--save", _save, "FILE",
                  "Write the recording at the end and at SIGUSR1, for its owner only\n"
                  "Further recordings go to FILE with -2, -3 before its ending");
        addOption(kGroup, "--save-count", _saveCount, "N",
                  "Keep at most so many recordings; the oldest are\n"
                  "replaced first (default: 16)");
        addOption(kGroup, "--save-bytes", _saveBytes, "N",
                  "Keep at most so many bytes of recordings; the\n"
                  "oldest are removed first (default: 67108864)");
        addFlag(kGroup, "--save-serial", _savesSerial, "Write serial numbers into recordings");
        addOption(kGroup, "--log-level", _logLevel, "LEVEL",
                  "Log from this level on: error, default or debug (default: default)");
        addFlag(kGroup, "--describe", _describe, "Show the devices and settings as JSON and exit");
    }

    void declareOther() {
        constexpr const char *kGroup = "Other";
        addOption(kGroup, "--plugin", _plugIn, "PATH",
                  "The plug-in's file (default: the one installed with the program)");
        _app.set_help_flag("-h,--help", "Show this help and exit")->group(kGroup);
        _app.set_version_flag("--version", std::string(kProgram) + " " + ZORVA_VERSION,
                              "Show the version and exit")
            ->group(kGroup);
    }

    [[nodiscard]] DaemonOptions read() const {
        DaemonOptions options;
        readDevices(options);
        readIds(options);
        if (_accel)
            options.accel = parseAccel(*_accel);
        readMaps(options);
        readKeys(options);
        readOutput(options);
        options.plugIn = _plugIn;
        requireDescriptionAlone();
        return options;
    }

    void readDevices(DaemonOptions &options) const {
        std::vector<std::string> before;
        bool hasFinger = false;
        for (const std::string &device : _devices) {
            requireOnce("--device", before, device, device);
            before.push_back(device);
            if (device.starts_with(kFingerPrefix)) {
                options.devices.emplace_back(readFinger(device.substr(kFingerPrefix.size())));
                hasFinger = true;
            } else {
                options.devices.emplace_back(readNode(device));
            }
        }
        if (!hasFinger && _seed)
            throw CliError("--seed is for --device sim:SCENARIO");
        if (!hasFinger && _duration)
            throw CliError("--duration is for --device sim:SCENARIO");
    }

    [[nodiscard]] static std::string readNode(const std::string &path) {
        if (path.find('/') == std::string::npos)
            refuse("--device", path,
                   " must be a path, as /dev/hidraw0, or sim:SCENARIO; scenarios are " + scenarioNames());
        return path;
    }

    [[nodiscard]] SimulatedFinger readFinger(const std::string &scenario) const {
        SimulatedFinger finger = fingerOf(parseScenario("--device", scenario));
        finger.seconds.reset();
        if (_seed)
            finger.seed = parseCount("--seed", *_seed, 0);
        if (_duration)
            finger.seconds = parseDuration(*_duration);
        return finger;
    }

    void readIds(DaemonOptions &options) const {
        if (_ids.empty())
            return;
        if (!_devices.empty())
            throw CliError("--id and --device exclude each other: --device looks for no make");
        options.ids.clear();
        for (const std::string &text : _ids) {
            const Linux::HidId id = parseId(text);
            requireOnce("--id", options.ids, id, text);
            options.ids.push_back(id);
        }
    }

    void readMaps(DaemonOptions &options) const {
        for (const std::string &text : _maps)
            try {
                options.keys.assign(text);
            } catch (const KeyMapError &error) {
                throw CliError(std::string("--map: ") + error.what());
            }
    }

    void readKeys(DaemonOptions &options) const {
        if (_keys && _noKeys)
            throw CliError("--keys and --no-keys exclude each other");
        options.sendsKeys = !_noKeys;
        options.sendsSimulatedKeys = _keys;
        if (_keyLimit)
            options.keyLimit = readKeyLimit(*_keyLimit);
    }

    [[nodiscard]] static unsigned readKeyLimit(const std::string &text) {
        unsigned limit = 0;
        const char *const end = text.data() + text.size();
        const auto [stop, error] = std::from_chars(text.data(), end, limit);
        if (error != std::errc() || stop != end || limit > KeyQuarantine::kHighestLimit)
            throw CliError("--key-limit: '" + text + "': must be an integer from 0 to " +
                           std::to_string(KeyQuarantine::kHighestLimit));
        return limit;
    }

    void readOutput(DaemonOptions &options) const {
        if (_events && *_events != "json")
            refuse("--events", *_events, " is not a format; json is");
        options.showsEvents = _events.has_value();
        options.waits = _wait;
        options.describe = _describe;
        if (_save)
            requireFileName("--save", *_save);
        options.saveFile = _save;
        readSaving(options);
        if (_logLevel)
            options.logLevel = parseLogLevel(*_logLevel);
        if (_plugIn)
            requireFileName("--plugin", *_plugIn);
    }

    void readSaving(DaemonOptions &options) const {
        if (!_save && (_saveCount || _saveBytes || _savesSerial))
            throw CliError("--save-count, --save-bytes and --save-serial need --save FILE");
        if (_saveCount)
            options.saveLimits.count = parseCount("--save-count", *_saveCount, 1);
        if (options.saveLimits.count > kMostRecordings)
            throw CliError("--save-count: '" + *_saveCount + "': must be an integer from 1 to " +
                           std::to_string(kMostRecordings));
        if (_saveBytes)
            options.saveLimits.bytes = parseCount("--save-bytes", *_saveBytes, 1);
        options.savesSerial = _savesSerial;
    }

    /// Options that have no meaning where nothing runs.
    void requireDescriptionAlone() const {
        const std::pair<const char *, bool> others[] = {
            {"--events", _events.has_value()},
            {"--save", _save.has_value()},
            {"--no-keys", _noKeys},
            {"--keys", _keys},
            {"--duration", _duration.has_value()},
            {"--wait", _wait},
        };
        for (const auto &[name, isGiven] : others)
            if (_describe && isGiven)
                throw CliError(std::string("--describe and ") + name + " exclude each other");
    }

    CLI::App _app;
    // As typed.
    std::vector<std::string> _devices, _ids, _maps;
    std::optional<std::string> _seed, _duration, _accel, _events, _save, _saveCount, _saveBytes, _logLevel,
        _plugIn, _keyLimit;
    bool _keys = false, _noKeys = false, _describe = false, _wait = false, _savesSerial = false;
};

} // namespace

DaemonCommand parseDaemonOptions(std::span<const std::string> arguments) {
    return DaemonCommandLine().parse(arguments);
}

} // namespace ZorvaTouch::Tools

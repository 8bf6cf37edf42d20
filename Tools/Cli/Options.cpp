#include "Tools/Cli/Options.h"

#include "Tools/Cli/CliError.h"
#include "Tools/Cli/Documents.h"
#include "Tools/Cli/HelpFormatter.h"
#include "Tools/Cli/OptionValues.h"
#include "Tools/Cli/Suggestion.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <memory>
#include <string_view>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr const char *kProgram = "zorvatouch";

constexpr const char *kMainFooter = R"(
Files: "-" is standard input or output. Recordings are JSON containers.

Examples:
  zorvatouch replay touch.json
  zorvatouch demo
  zorvatouch make hold.txt - | zorvatouch replay -
  zorvatouch help COMMAND

Environment:
  NO_COLOR        no colours if set to a text that is not empty
  TERM            neither colours nor a line of electrodes if it is "dumb"
  XDG_STATE_HOME  demo keeps its recording below (default: ~/.local/state)

Exit status:
  0    done
  1    a check failed, or the service refused a property
  2    bad usage, or a file that cannot be read or written
  141  the reader of a pipe has closed it
)";

constexpr const char *kReplayFooter = R"(
Examples:
  zorvatouch replay monday.json tuesday.json
  zorvatouch replay touch.json --set HoldTimeoutMilliseconds=700 --speed 1
  zorvatouch replay touch.json --json > expected.jsonl
  zorvatouch replay touch.json --expect expected.jsonl
)";

constexpr const char *kInfoFooter = R"(
Examples:
  zorvatouch info touch.json
  zorvatouch info --json *.json
)";

constexpr const char *kShowFooter = R"(
Examples:
  zorvatouch show touch.json
  zorvatouch show touch.json --frame 12 --raw
)";

constexpr const char *kConvertFooter = R"(
Examples:
  zorvatouch convert old.json new.json
)";

constexpr const char *kTrimFooter = R"(
Examples:
  zorvatouch trim long.json short.json --max 500
)";

constexpr const char *kMakeFooter = R"(
Examples:
  zorvatouch make tap.txt tap.json
  printf 'touch A=300 for 120ms\nidle for 100ms\n' |
    zorvatouch make - - | zorvatouch replay -

Exit status:
  1  the text has expected lines, and the replay differs from them
)";

constexpr const char *kSynthFooter = R"(
Examples:
  zorvatouch synth --list
  zorvatouch synth --scenario slides --seed 7 --duration 10 -o slides.json
  zorvatouch synth --scenario taps --noise 8 -o - | zorvatouch replay -
)";

constexpr const char *kHelpFooter = R"(
Examples:
  zorvatouch help
  zorvatouch help replay
)";

constexpr const char *kShortHelpEnd = R"(
"zorvatouch help" shows more, "zorvatouch help COMMAND" a command's options.
To begin with, try "zorvatouch demo".
)";

constexpr const char *kHostFooter = R"(
Examples:
  zorvatouch host --get Version
  zorvatouch host --device sim:taps --seed 7 --get Pipeline.Algs.DebugInfo
  zorvatouch host --device recording:touch.json \
    --set Pipeline.Algs.HoldTimeoutMilliseconds=700
  zorvatouch host --device sim:day --speed 1 --save live.json
)";

constexpr const char *kDemoFooter = R"(
Examples:
  zorvatouch demo
  zorvatouch demo --scenario slides --seed 3 --save slides.json
  zorvatouch demo --forever --quiet
)";

/// Declares one command: its options are kept as text and read by `read` once they are all there.
class CommandLine {
public:
    CommandLine() : _app("Runs the touch sensor's service, and replays and inspects recordings.", kProgram) {
        _app.set_version_flag("--version", std::string(kProgram) + " " + ZORVA_VERSION,
                              "Show the version and exit");
        describeHelp(_app);
        describeFormat();
        _app.footer(kMainFooter);
        _app.require_subcommand(0, 1); // so that a file may have a command's name
        declareReplay();
        declareInfo();
        declareShow();
        declareConvert();
        declareTrim();
        declareMake();
        declareSynth();
        declareLive();
        declareHelp();
    }

    [[nodiscard]] Options parse(std::span<const std::string> arguments) {
        if (arguments.empty())
            return AnswerOptions{shortHelp(), kExitError};
        try {
            _app.parse(libraryArguments(arguments));
        } catch (const CLI::CallForHelp &) {
            return AnswerOptions{helpText()};
        } catch (const CLI::CallForVersion &) {
            return AnswerOptions{_app.version() + "\n"};
        } catch (const CLI::ParseError &error) {
            throw CliError(parseProblem(error) + hint());
        }
        return readOptions();
    }

private:
    /// In the order the library wants, from last to first. It takes "[a,b]" for two arguments, but as a
    /// file's name it is one.
    static std::vector<std::string> libraryArguments(std::span<const std::string> arguments) {
        std::vector<std::string> reversed(arguments.rbegin(), arguments.rend());
        for (std::string &argument : reversed)
            if (argument.starts_with('[') && argument.ends_with(']'))
                argument.insert(0, "./");
        return reversed;
    }

    void describeFormat() {
        const auto formatter = std::make_shared<HelpFormatter>(24);
        _app.formatter(formatter); // the commands' too
        formatter->label("SUBCOMMAND", "COMMAND");
        formatter->label("Positionals", "Arguments");
        formatter->label("REQUIRED", "");
    }

    static void describeHelp(CLI::App &app) { app.set_help_flag("-h,--help", "Show this help and exit"); }

    CLI::App &declare(const char *name, const char *description, const char *footer) {
        CLI::App &command = *_app.add_subcommand(name, description);
        describeHelp(command);
        command.group("Commands");
        command.footer(footer);
        return command;
    }

    static void addFiles(CLI::App &command, std::vector<std::string> &files) {
        command.add_option("FILE", files, "Recordings")->required()->type_name("");
    }

    static void addInAndOut(CLI::App &command, std::string &in, std::string &out, const char *inDescription) {
        command.add_option("IN", in, inDescription)->required()->type_name("");
        command.add_option("OUT", out, "Recording to write")->required()->type_name("");
    }

    void declareReplay() {
        CLI::App &command =
            declare("replay", "Play recordings and show the recognized gestures", kReplayFooter);
        addFiles(command, _replay.files);
        command.add_option("--speed", _speed, "Speed factor, 1 is as recorded (default: inf, no pauses)")
            ->type_name("X");
        command
            .add_option("--set", _settings,
                        "Begin with a state, as --set ActivationThreshold=250 (may be repeated)")
            ->type_name("KEY=VALUE")
            ->allow_extra_args(false);
        command.add_flag("--describe", _replay.describe,
                         "Add the recognizer's view of each frame with a gesture");
        command.add_flag("--json", _replay.json, "Write a line of JSON for each report");
        command.add_option("--expect", _replay.expectFile, "Compare with a file that --json has written")
            ->type_name("FILE");
        command
            .add_option("--log-level", _logLevel,
                        "Log to standard error: debug, default or error (default: error)")
            ->type_name("LEVEL");
    }

    void declareInfo() {
        CLI::App &command = declare("info", "Summarize recordings", kInfoFooter);
        addFiles(command, _info.files);
        command.add_flag("--json", _info.json, "Write a line of JSON for each recording");
    }

    void declareShow() {
        CLI::App &command = declare("show", "Draw an image of the sensor", kShowFooter);
        command.add_option("FILE", _show.file, "Recording")->required()->type_name("");
        command.add_option("--frame", _frame, "Index in the recording (default: the strongest image)")
            ->type_name("N");
        command.add_flag("--raw", _show.raw, "Draw the raw counts instead of the signals");
    }

    void declareConvert() {
        CLI::App &command =
            declare("convert", "Write a recording of any version as the current one", kConvertFooter);
        addInAndOut(command, _convert.in, _convert.out, "Recording to read");
    }

    void declareTrim() {
        CLI::App &command =
            declare("trim", "Keep the newest frames and the states that they need", kTrimFooter);
        addInAndOut(command, _trim.in, _trim.out, "Recording to read");
        command.add_option("--max", _max, "Frames to keep, state writes not counted")
            ->required()
            ->type_name("N");
    }

    void declareMake() {
        CLI::App &command = declare("make", "Make a recording from its text form, and check it", kMakeFooter);
        addInAndOut(command, _make.in, _make.out, "Text to read");
    }

    void declareSynth() {
        _synth.declare(declare("synth", "Make a labelled recording without a device", kSynthFooter));
    }

    void declareLive() {
        _host.declare(
            declare("host", "Load the service as a host does; get and set properties", kHostFooter));
        _demo.declare(declare("demo", "Watch the live service with a simulated finger", kDemoFooter));
    }

    void declareHelp() {
        declare("help", "Show the help of the program or of a command", kHelpFooter)
            .add_option("COMMAND", _helpCommand, "Command (default: the program)")
            ->type_name("");
    }

    /// The command that was named, or the program if none was.
    [[nodiscard]] CLI::App &chosenApp() {
        const auto chosen = _app.get_subcommands();
        return chosen.empty() ? _app : *chosen.front();
    }

    [[nodiscard]] std::string helpText() { return helpOf(chosenApp()); }

    /// The library's own `help` of the program gives the chosen command's.
    [[nodiscard]] std::string helpOf(const CLI::App &app) const {
        if (&app != &_app)
            return app.help(kProgram);
        return _app.get_formatter()->make_help(&_app, kProgram, CLI::AppFormatMode::Normal);
    }

    [[nodiscard]] std::string shortHelp() {
        _app.footer(kShortHelpEnd);
        return _app.help();
    }

    [[nodiscard]] std::vector<std::string_view> commandNames() const {
        std::vector<std::string_view> names;
        for (const CLI::App *const command : _app.get_subcommands(nullptr))
            names.push_back(command->get_name());
        return names;
    }

    [[nodiscard]] std::string unknownCommand(const std::string &name) const {
        return "'" + name + "' is not a command" + suggestion(name, commandNames());
    }

    [[nodiscard]] AnswerOptions readHelp() const {
        if (!_helpCommand)
            return {helpOf(_app)};
        for (const CLI::App *const command : _app.get_subcommands(nullptr))
            if (command->get_name() == *_helpCommand)
                return {helpOf(*command)};
        throw CliError(unknownCommand(*_helpCommand));
    }

    [[nodiscard]] std::string hint() {
        std::string text(" (see ");
        text.append(kProgram);
        if (&chosenApp() != &_app)
            text.append(" ").append(chosenApp().get_name());
        return text.append(" --help)");
    }

    /// What the library found wrong, in one line.
    [[nodiscard]] std::string parseProblem(const CLI::ParseError &error) {
        const CLI::App &app = chosenApp();
        const auto extras = app.remaining();
        const auto option = std::find_if(extras.begin(), extras.end(),
                                         [](const std::string &extra) { return extra.starts_with('-'); });
        if (option != extras.end())
            return unknownOption(*option, app);
        if (!extras.empty())
            return &app == &_app ? unknownCommand(extras.front())
                                 : "unexpected argument '" + extras.front() + "'";
        std::string text = error.what();
        std::replace(text.begin(), text.end(), '\n', ' ');
        return text;
    }

    [[nodiscard]] Options readOptions() {
        try {
            return readChosen(chosenApp().get_name());
        } catch (const CliError &error) {
            throw CliError(error.what() + hint());
        }
    }

    [[nodiscard]] Options readChosen(const std::string &command) {
        if (command == "replay")
            return readReplay();
        if (command == "info")
            return readInfo();
        if (command == "show")
            return readShow();
        if (command == "convert")
            return _convert;
        if (command == "trim")
            return readTrim();
        if (command == "make")
            return _make;
        if (command == "synth")
            return _synth.read();
        if (command == "host")
            return _host.read();
        if (command == "demo")
            return _demo.read();
        if (command == "help")
            return readHelp();
        throw CliError("a command is required");
    }

    static void requireOneStandardInput(std::vector<std::string> inputs) {
        if (std::count(inputs.begin(), inputs.end(), kStandardStreamName) > 1)
            throw CliError("standard input can be read only once");
    }

    [[nodiscard]] ReplayOptions readReplay() {
        if (_speed)
            _replay.speed = parseSpeed(*_speed);
        for (const std::string &setting : _settings)
            _replay.settings.push_back(parseSetting(setting));
        if (_logLevel)
            _replay.logLevel = parseLogLevel(*_logLevel);
        std::vector<std::string> inputs = _replay.files;
        if (_replay.expectFile) {
            if (_replay.files.size() != 1)
                throw CliError("--expect takes exactly one recording");
            inputs.push_back(*_replay.expectFile);
        }
        requireOneStandardInput(inputs);
        return _replay;
    }

    [[nodiscard]] InfoOptions readInfo() {
        requireOneStandardInput(_info.files);
        return _info;
    }

    [[nodiscard]] ShowOptions readShow() {
        if (_frame)
            _show.frame = parseCount("--frame", *_frame, 0);
        return _show;
    }

    [[nodiscard]] TrimOptions readTrim() {
        _trim.max = parseCount("--max", _max, 1);
        return _trim;
    }

    CLI::App _app;
    ReplayOptions _replay;
    InfoOptions _info;
    ShowOptions _show;
    ConvertOptions _convert;
    TrimOptions _trim;
    MakeOptions _make;
    SynthArguments _synth;
    HostArguments _host;
    DemoArguments _demo;
    // As typed.
    std::optional<std::string> _speed, _logLevel, _frame, _helpCommand;
    std::vector<std::string> _settings;
    std::string _max;
};

} // namespace

Options parseOptions(std::span<const std::string> arguments) { return CommandLine().parse(arguments); }

} // namespace ZorvaTouch::Tools

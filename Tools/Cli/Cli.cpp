#include "Tools/Cli/Cli.h"

#include "Shared/Util/Text.h"
#include "Tools/Cli/CliError.h"
#include "Tools/Cli/ConvertCommand.h"
#include "Tools/Cli/DemoCommand.h"
#include "Tools/Cli/HostCommand.h"
#include "Tools/Cli/InfoCommand.h"
#include "Tools/Cli/MakeCommand.h"
#include "Tools/Cli/Options.h"
#include "Tools/Cli/ReplayCommand.h"
#include "Tools/Cli/ShowCommand.h"
#include "Tools/Cli/SynthCommand.h"
#include "Tools/Cli/TrimCommand.h"

#include <exception>
#include <new>
#include <string_view>
#include <variant>

namespace ZorvaTouch::Tools {
namespace {

/// The command for each kind of options.
struct Commands {
    Environment &environment;

    ExitStatus operator()(const ReplayOptions &options) const { return runReplay(options, environment); }
    ExitStatus operator()(const InfoOptions &options) const { return runInfo(options, environment); }
    ExitStatus operator()(const ShowOptions &options) const { return runShow(options, environment); }
    ExitStatus operator()(const ConvertOptions &options) const { return runConvert(options, environment); }
    ExitStatus operator()(const TrimOptions &options) const { return runTrim(options, environment); }
    ExitStatus operator()(const MakeOptions &options) const { return runMake(options, environment); }
    ExitStatus operator()(const SynthOptions &options) const { return runSynth(options, environment); }
    ExitStatus operator()(const HostOptions &options) const { return runHost(options, environment); }
    ExitStatus operator()(const DemoOptions &options) const { return runDemo(options, environment); }
    ExitStatus operator()(const AnswerOptions &options) const {
        (options.status == kExitDone ? environment.output : environment.errorOutput).write(options.text);
        return options.status;
    }
};

void reportError(std::string_view message, Environment &environment) noexcept {
    try {
        environment.output.flush(); // what was done so far stays in order before the error
    } catch (...) {                 // one error is enough
    }
    try {
        std::string &text = environment.errorOutput.text();
        text.append("zorvatouch: ").append(Util::printable(message)).append("\n");
        environment.errorOutput.flush();
    } catch (...) { // nobody is there to read it: the status must do
    }
}

} // namespace

int runCli(std::span<const std::string> arguments, Environment &environment) noexcept {
    try {
        const ExitStatus status = std::visit(Commands{environment}, parseOptions(arguments));
        environment.output.flush();
        environment.errorOutput.flush();
        return status;
    } catch (const ClosedPipe &) {
        return kExitClosedPipe;
    } catch (const std::bad_alloc &) {
        reportError("out of memory", environment);
    } catch (const std::exception &error) {
        reportError(error.what(), environment);
    }
    return kExitError;
}

} // namespace ZorvaTouch::Tools

#include "Tools/Cli/ReplayCommand.h"

#include "Tools/Cli/Documents.h"
#include "Tools/Cli/Progress.h"
#include "Tools/Cli/ReplayExpecter.h"
#include "Tools/Cli/ReplayJson.h"
#include "Tools/Cli/ReplayTable.h"

#include <cmath>
#include <memory>

namespace ZorvaTouch::Tools {
namespace {

std::unique_ptr<ReplayPrinter> makePrinter(const ReplayOptions &options, Environment &environment) {
    if (options.json)
        return std::make_unique<ReplayJson>(environment.output, options.describe);
    return std::make_unique<ReplayTable>(environment, options.describe);
}

std::unique_ptr<Replay> openReplay(const std::string &file, const ReplayOptions &options,
                                   Environment &environment, Ports::LogProvider &logs, Progress &progress) {
    auto replay =
        std::make_unique<Replay>(readRecording(file, environment, progress).frames, environment.clock, logs);
    for (const Setting &setting : options.settings)
        replay->setState(setting.key, setting.value);
    return replay;
}

/// Reads a recording and plays it.
void play(const std::string &file, const ReplayOptions &options, Environment &environment,
          Ports::LogProvider &logs, ReplayPrinter &printer) {
    const std::string title = inputTitle(file);
    Progress progress(environment, title);
    const auto opened = openReplay(file, options, environment, logs, progress);
    Replay &replay = *opened;
    const bool isWatched = std::isfinite(options.speed); // then each gesture is shown as it happens
    progress.begin("replaying", replay.frames().size());
    printer.begin(title, replay);
    while (replay.next(options.speed)) {
        printer.print(replay);
        if (isWatched)
            environment.output.flush();
        progress.update(replay.frame().index + 1);
    }
    printer.end(replay);
}

ExitStatus runExpect(const ReplayOptions &options, Environment &environment, Ports::LogProvider &logs) {
    const std::string expected = readDocument(*options.expectFile, environment);
    ReplayExpecter expecter(expected, inputTitle(*options.expectFile), options.describe, environment.output);
    play(options.files.front(), options, environment, logs, expecter);
    expecter.finish();
    return expecter.differs() ? kExitCheckFailed : kExitDone;
}

} // namespace

ExitStatus runReplay(const ReplayOptions &options, Environment &environment) {
    const auto logs = environment.openLogs(options.logLevel);
    if (options.expectFile)
        return runExpect(options, environment, *logs);
    const auto printer = makePrinter(options, environment);
    for (const std::string &file : options.files)
        play(file, options, environment, *logs, *printer);
    printer->finish();
    return kExitDone;
}

} // namespace ZorvaTouch::Tools

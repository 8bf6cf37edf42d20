#include "Tools/Cli/MakeCommand.h"

#include "Shared/RecordingContainer.h"
#include "Tools/Cli/CliError.h"
#include "Tools/Cli/Documents.h"
#include "Tools/Stimulus/Golden.h"
#include "Tools/Stimulus/StimulusText.h"

#include <string>

namespace ZorvaTouch::Tools {
namespace {

Stimulus readStimulus(const std::string &name, Environment &environment) {
    const std::string text = readDocument(name, environment);
    try {
        return parseStimulus(text);
    } catch (const StimulusError &error) {
        throw CliError(inputTitle(name) + ": " + error.what());
    }
}

} // namespace

ExitStatus runMake(const MakeOptions &options, Environment &environment) {
    const Stimulus stimulus = readStimulus(options.in, environment);
    Progress progress(environment, inputTitle(options.in));
    writeRecording(options.out, stimulus.frames, environment, progress);
    if (stimulus.expected.empty()) // a text may have none
        return kExitDone;
    const std::string difference = compareExpected(stimulus.frames, stimulus.expected);
    if (difference.empty())
        return kExitDone;
    environment.output.flush(); // the recording may go there
    environment.errorOutput.write("zorvatouch: " + inputTitle(options.in) +
                                  ": the replay differs from the expected lines (- expected, + replayed)\n" +
                                  difference);
    return kExitCheckFailed;
}

} // namespace ZorvaTouch::Tools

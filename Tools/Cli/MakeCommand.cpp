#include "Tools/Cli/MakeCommand.h"

#include "Shared/RecordingContainer.h"
#include "Tools/Cli/CliError.h"
#include "Tools/Cli/Documents.h"
#include "Tools/Stimulus/StimulusText.h"

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
    return kExitDone;
}

} // namespace ZorvaTouch::Tools

#include "Tools/Cli/SynthCommand.h"

#include "Shared/RecordingContainer.h"
#include "Synth/Stream.h"
#include "Tools/Cli/Documents.h"
#include "Tools/Cli/Layout.h"
#include "Tools/Cli/OptionValues.h"

#include <string>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::size_t kNameWidth = 13;
constexpr std::size_t kDurationWidth = 5;

/// What the scenario sets unless the command line does: " (--drift 15)".
std::string ownDefaults(const Synth::Scenario &scenario) {
    const Synth::Parameters usual;
    const Synth::Parameters own = Synth::parametersOf(scenario);
    std::string text;
    for (const Synth::ParameterInfo &info : Synth::parameters())
        if (own.*info.value != usual.*info.value)
            text.append(" --").append(info.name).append(" ").append(numberText(own.*info.value));
    return text.empty() ? text : " (" + text.substr(1) + ")";
}

void appendScenario(std::string &text, const Synth::Scenario &scenario) {
    appendLeft(text, scenario.name, kNameWidth);
    appendRight(text, numberText(scenario.duration) + " s", kDurationWidth);
    text.append("  ").append(scenario.description).append(ownDefaults(scenario)).append("\n");
}

} // namespace

ExitStatus runSynth(const SynthOptions &options, Environment &environment) {
    std::string text;
    if (options.list) {
        for (const Synth::Scenario &scenario : Synth::scenarios())
            appendScenario(text, scenario);
        environment.output.write(text);
        return kExitDone;
    }
    Progress progress(environment, std::string(options.scenario->name));
    progress.begin("generating", static_cast<std::uint64_t>(Synth::microseconds(options.duration)));
    const FrameList frames = Synth::synthesize(
        *options.scenario, options.parameters, options.seed, options.duration,
        [&progress](Synth::Microseconds made) { progress.update(static_cast<std::uint64_t>(made)); });
    writeRecording(options.out, frames, environment, progress);
    return kExitDone;
}

} // namespace ZorvaTouch::Tools

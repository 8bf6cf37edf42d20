#include "Tools/Cli/SynthOptions.h"

#include "Tools/Cli/CliError.h"
#include "Tools/Cli/OptionValues.h"
#include "Tools/Cli/Suggestion.h"

#include <CLI/CLI.hpp>

#include <string_view>

namespace ZorvaTouch::Tools {
namespace {

constexpr const char *kDefaultScenario = "day";

std::string flagOf(const Synth::ParameterInfo &info) { return "--" + std::string(info.name); }

std::string helpOf(const Synth::ParameterInfo &info) {
    return std::string(info.meaning) + " (default: " + numberText(info.standard) + ")";
}

const Synth::Scenario &scenarioOrHint(std::string_view name) {
    if (const Synth::Scenario *scenario = Synth::scenarioNamed(name))
        return *scenario;
    throw CliError("--scenario: '" + std::string(name) + "' is not a scenario" +
                   suggestion(name, scenarioNameList(), "; --list shows them"));
}

} // namespace

void SynthArguments::declare(CLI::App &command) {
    command.add_option("--scenario", _scenario, "What happens (default: day)")->type_name("NAME");
    command.add_option("--seed", _seed, "The same seed gives the same recording (default: 1)")
        ->type_name("N");
    command.add_option("--duration", _duration, "Length in seconds (default: the scenario's)")
        ->type_name("S");
    command.add_option("-o,--output", _out, "Recording to write (required, unless --list is given)")
        ->type_name("FILE");
    command.add_flag("--list", _list, "List the scenarios and exit");
    for (std::size_t i = 0; i < Synth::kParameterCount; ++i) {
        const Synth::ParameterInfo &info = Synth::parameters()[i];
        command.add_option(flagOf(info), _parameters[i], helpOf(info))
            ->type_name(std::string(info.unit))
            ->group("Parameters, with their units");
    }
}

SynthOptions SynthArguments::read() const {
    SynthOptions options;
    options.list = _list;
    options.scenario = &scenarioOrHint(_scenario.value_or(kDefaultScenario));
    options.parameters = Synth::parametersOf(*options.scenario);
    for (std::size_t i = 0; i < Synth::kParameterCount; ++i) {
        const Synth::ParameterInfo &info = Synth::parameters()[i];
        if (_parameters[i])
            options.parameters.*info.value =
                parseQuantity(flagOf(info), *_parameters[i], info.lowest, info.highest, info.unit);
    }
    if (_seed)
        options.seed = parseCount("--seed", *_seed, 0);
    options.duration = _duration ? parseDuration(*_duration) : options.scenario->duration;
    if (!_out && !_list)
        throw CliError("--output is required");
    options.out = _out.value_or("");
    return options;
}

} // namespace ZorvaTouch::Tools

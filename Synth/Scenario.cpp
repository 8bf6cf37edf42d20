#include "Synth/Scenario.h"

#include <algorithm>

namespace ZorvaTouch::Synth {
namespace {

void tuneDrift(Parameters &parameters) {
    parameters.drift = 15;
    parameters.driftTime = 8;
    parameters.warmDrift = 120;
}

void tuneLink(Parameters &parameters) {
    parameters.dropRate = 5;
    parameters.repeatRate = 3;
}

void tuneDay(Parameters &parameters) {
    parameters.dropRate = 0.1;
    parameters.repeatRate = 0.05;
}

constexpr std::array<Scenario, kScenarioCount> kScenarios{{
    {"idle", "Nothing touches the sensor", 10, makeNothing, nullptr},
    {"taps", "Taps in each region, light to heavy, 40 to 400 ms", 20, makeTap, nullptr},
    {"double-taps", "Two taps in quick succession", 20, makeDoubleTap, nullptr},
    {"holds", "Holds of 0.6 to 10 s", 30, makeHold, nullptr},
    {"slides", "Holds that slide to other regions", 20, makeSlide, nullptr},
    {"palms", "Palms and broad contacts", 20, makePalm, nullptr},
    {"thumbs", "Thumbs that rest at the side, some with a tap elsewhere", 30, makeThumb, nullptr},
    {"grazes", "Quick light touches that cross the sensor", 15, makeGraze, nullptr},
    {"water", "Drops that stay or run down", 20, makeWater, nullptr},
    {"drift", "Long holds that warm the sensor, on a sensor that drifts", 30, makeLongHold, tuneDrift},
    {"link-faults", "Taps and holds with images lost and repeated", 20, makeTapOrHold, tuneLink},
    {"resets", "Contacts in the middle of which the device resets", 20, makeReset, nullptr},
    {"day", "Everything, with long pauses", 120, makeAnything, tuneDay},
}};

} // namespace

const std::array<Scenario, kScenarioCount> &scenarios() noexcept { return kScenarios; }

const Scenario *scenarioNamed(std::string_view name) noexcept {
    const auto found = std::find_if(kScenarios.begin(), kScenarios.end(),
                                    [name](const Scenario &scenario) { return scenario.name == name; });
    return found == kScenarios.end() ? nullptr : &*found;
}

Parameters parametersOf(const Scenario &scenario) noexcept {
    Parameters parameters;
    if (scenario.tune)
        scenario.tune(parameters);
    return parameters;
}

} // namespace ZorvaTouch::Synth

#include "Tests/Kernel/SurfaceOptions.h"

#include "Tests/Kernel/Numbers.h"

#include <getopt.h>

#include <array>
#include <cmath>
#include <cstdlib>
#include <stdexcept>
#include <string>

namespace ZorvaTouch::KernelTests {
namespace {

constexpr std::array<option, 10> kOptions{{{"scenario", required_argument, nullptr, 'c'},
                                           {"seed", required_argument, nullptr, 's'},
                                           {"seconds", required_argument, nullptr, 't'},
                                           {"input", no_argument, nullptr, 'i'},
                                           {"feature", required_argument, nullptr, 'f'},
                                           {"loose", no_argument, nullptr, 'l'},
                                           {"name", required_argument, nullptr, 'n'},
                                           {"serial", required_argument, nullptr, 'u'},
                                           {"keep", no_argument, nullptr, 'k'},
                                           {nullptr, 0, nullptr, 0}}};

double secondsFrom(const char *text) {
    char *end = nullptr;
    const double seconds = std::strtod(text, &end);
    if (end == text || *end != '\0' || !std::isfinite(seconds) || seconds <= 0)
        throw std::invalid_argument("no time: " + std::string(text));
    return seconds;
}

const Synth::Scenario *scenarioFrom(const char *name) {
    const Synth::Scenario *const scenario = Synth::scenarioNamed(name);
    if (!scenario)
        throw std::invalid_argument("no scenario: " + std::string(name));
    return scenario;
}

void take(SurfaceOptions &options, int letter, const char *value) {
    switch (letter) {
    case 'c':
        options.scenario = scenarioFrom(value);
        return;
    case 's':
        options.seed = numberFrom(value);
        return;
    case 't':
        options.seconds = secondsFrom(value);
        return;
    case 'i':
        options.readsInput = true;
        return;
    case 'f':
        return options.features.change(value);
    case 'l':
        options.isLoose = true;
        return;
    case 'n':
        options.identity.name = value;
        return;
    case 'u':
        options.identity.serial = value;
        return;
    case 'k':
        options.isKept = true;
        return;
    default:
        throw std::invalid_argument(kSurfaceUsage);
    }
}

} // namespace

SurfaceOptions surfaceOptions(int count, char **arguments) {
    SurfaceOptions options;
    opterr = 0;
    for (int letter; (letter = getopt_long(count, arguments, "", kOptions.data(), nullptr)) != -1;)
        take(options, letter, optarg);
    if (optind != count)
        throw std::invalid_argument(kSurfaceUsage);
    if (options.scenario && options.seconds <= 0)
        options.seconds = options.scenario->duration;
    if (!options.scenario && !options.readsInput)
        options.isKept = true;
    return options;
}

} // namespace ZorvaTouch::KernelTests

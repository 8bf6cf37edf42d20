#pragma once

#include "Synth/Parameters.h"
#include "Synth/Scenario.h"

#include <array>
#include <cstdint>
#include <optional>
#include <string>

namespace CLI {
class App;
}

namespace ZorvaTouch::Tools {

struct SynthOptions {
    const Synth::Scenario *scenario = nullptr; ///< one of the table
    Synth::Parameters parameters;              ///< the scenario's, and what was set on top
    std::uint64_t seed = 1;
    double duration = 0; ///< s
    std::string out;
    bool list = false; ///< the scenarios, instead of a recording
};

/// The options of `synth` as they are typed. There is a flag for each parameter.
class SynthArguments {
public:
    /// @param command  Keeps pointing here.
    void declare(CLI::App &command);
    /// @throws CliError
    [[nodiscard]] SynthOptions read() const;

private:
    std::optional<std::string> _scenario, _seed, _duration, _out;
    std::array<std::optional<std::string>, Synth::kParameterCount>
        _parameters; ///< in the order of their table
    bool _list = false;
};

} // namespace ZorvaTouch::Tools

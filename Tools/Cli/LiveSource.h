#pragma once

#include "Host/Simulated/Player.h"
#include "Synth/Parameters.h"
#include "Synth/Scenario.h"
#include "Tools/Cli/Environment.h"

#include <cstdint>
#include <optional>
#include <string>

namespace ZorvaTouch::Tools {

/// Somebody who touches a simulated sensor.
struct SimulatedFinger {
    const Synth::Scenario *scenario = nullptr; ///< one of the table
    Synth::Parameters parameters;
    std::uint64_t seed = 1;
    std::optional<double> seconds; ///< nothing: without an end
};

/// Frames for a simulated device.
struct LiveSource {
    Simulated::FrameSource frames;
    std::uint64_t startNs = 0; ///< the first frame's time; 0 if there is none
};

/// What the finger does, with samples of the accelerometer beside it.
[[nodiscard]] LiveSource playFinger(const SimulatedFinger &finger);

/// A recording's frames.
/// @throws CliError
[[nodiscard]] LiveSource playRecording(const std::string &file, Environment &environment);

} // namespace ZorvaTouch::Tools

#pragma once

#include "Host/Simulated/Player.h"
#include "Synth/Parameters.h"
#include "Synth/Scenario.h"

#include <cstdint>
#include <optional>

namespace ZorvaTouch::Tools {

/// Somebody who touches a simulated sensor.
struct SimulatedFinger {
    const Synth::Scenario *scenario = nullptr; ///< one of the table
    Synth::Parameters parameters;
    std::uint64_t seed = 1;
    std::optional<double> seconds; ///< nothing: without an end
};

/// The scenario's own settings and length.
[[nodiscard]] SimulatedFinger fingerOf(const Synth::Scenario &scenario);

/// What the finger does, with samples of the accelerometer beside it.
[[nodiscard]] Simulated::FrameSource framesOf(const SimulatedFinger &finger);

} // namespace ZorvaTouch::Tools

#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Hosting/FingerSource.h"

#include <cstdint>
#include <string>

namespace ZorvaTouch::Tools {

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

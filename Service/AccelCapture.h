#pragma once

#include "Shared/PipelineInput.h"
#include "Shared/Util/PropertyValue.h"

#include <cstddef>
#include <cstdint>
#include <deque>

namespace ZorvaTouch {

/// One sample of the accelerometer.
struct AccelSample {
    std::uint64_t timestampMach; ///< host ticks, taken when the event arrives
    float x, y, z;               ///< g
};

/// Metadata key of the samples in a recording.
inline constexpr const char *kAccelMetadataKey = "Accel";

/// Samples around touches: keeps the latest ones, and once a gesture asks for it passes them and as many new
/// ones on to the recording.
///
/// Threads: no lock of its own; the caller serialises.
struct AccelCapture {
    /// Samples kept from before a gesture, and asked for after it: one second at 100 Hz.
    static constexpr std::size_t kSampleCount = 100;

    std::uint64_t samplesNeededCount = 0; ///< live samples that are still to be passed on
    std::deque<AccelSample> samples;      ///< oldest first, at most `kSampleCount`

    /// A gesture was dispatched. Sets the count, so that a further gesture starts it afresh.
    void requestSamples() noexcept { samplesNeededCount = kSampleCount; }

    /// Keeps a sample, or passes what was kept and then this one on to `recording`.
    void handleSample(const AccelSample &sample, PipelineInput &recording);
};

} // namespace ZorvaTouch

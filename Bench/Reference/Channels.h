#pragma once

#include "Shared/InputReport.h"

#include <cstdint>
#include <string>
#include <vector>

/// The recognizer once more, as it is first written down: vectors of records, copied and sorted whole, one
/// rule after the other. The benchmarks measure the real one beside it, and the tests compare both frame by
/// frame.
///
/// Nothing here looks at the real model; what the two share are the report, the event, the property value and
/// the formatting of numbers.
namespace ZorvaTouch::Reference {

/// Region codes, as they travel in events.
enum Region : std::uint32_t {
    kRegionNone = 0,
    kRegionPlayPause = 1,
    kRegionVolumeDown = 2,
    kRegionVolumeUp = 3,
};

[[nodiscard]] Region regionOf(std::int32_t electrodeIndex);

/// One channel. The real model's `Pixel` explains the fields.
struct Pixel {
    Pixel(std::int32_t electrodeIndex, float channelGain);

    /// @param raw  Sensor counts, or the sum of a group's values.
    void update(std::int32_t raw, float activationThreshold);
    /// Forgets what was seen since the last reset; the hysteresis stays.
    void resetStatistics();
    [[nodiscard]] Region region() const { return regionOf(index); }

    std::int32_t value = 0;
    float gain;
    float normalizedValue = 0;
    float peakValue = 0;
    float valleyValue = 0;
    bool isTouched = false;
    bool isAboveFloor = false;
    bool wasAboveFloor = false;
    bool wasTouched = false;
    float maxNormalizedValue = 0;
    std::int32_t index; ///< electrode, 0 = A; of a virtual pixel the strongest member
};

struct VirtualPixel : Pixel {
    VirtualPixel(const std::string &letters, float channelGain);

    std::string name; ///< the members' letters
};

/// The 15 electrodes with their built-in gains.
[[nodiscard]] std::vector<Pixel> makePixels();

/// Sums over groups of electrodes; the vectors run in parallel, one entry for each group.
class VirtualImage {
public:
    VirtualImage();

    /// @param pixels  The electrodes, after their own update in this frame.
    void updateValues(const std::vector<Pixel> &pixels);

    std::vector<std::int32_t> values;
    std::vector<std::string> names;
    std::vector<std::int32_t> dominantIndices; ///< never reset
    std::vector<float> normalizationFactors;
};

/// One channel for each group of the image.
[[nodiscard]] std::vector<VirtualPixel> makeVirtualPixels(const VirtualImage &image);

} // namespace ZorvaTouch::Reference

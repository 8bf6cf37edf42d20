#pragma once

#include "Shared/Pixel.h"

#include <array>
#include <cstdint>

namespace ZorvaTouch {

/// Linear classifier that scores how much a frame looks like an intended finger touch: positive for a finger,
/// negative for a palm or an accident.
///
/// Its features are the values of all 38 channels ranked from strongest to weakest, so the score depends on
/// the shape of the profile and not on where the finger is. The features are scaled counts, not normalized
/// ones: the model is tied to the default gains.
class SVM {
public:
    SVM() noexcept;

    /// Scores one frame.
    ///
    /// The score is 0, without the bias, unless the strongest channel exceeds `activationThreshold` or two
    /// channels are above the noise floor.
    ///
    /// @param activationThreshold  Scaled sensor counts.
    /// @param now                  Frame time in ms. Not used.
    ///
    /// Realtime: yes.
    void updateSVMScore(const Pixels &pixels, const VirtualPixels &virtualPixels, float activationThreshold,
                        std::uint32_t now) noexcept;

    [[nodiscard]] float getSVMScore() const noexcept { return score; }

    float score = 0; ///< of the last frame; unitless, bounded only by the inputs
    // By rank, rank 0 = strongest channel. The score is the bias plus the sum of (value - mean) / scale *
    // weight.
    std::array<float, kChannelCount> means;   ///< scaled sensor counts
    std::array<float, kChannelCount> scales;  ///< scaled sensor counts
    std::array<float, kChannelCount> weights; ///< unitless
    float bias;                               ///< unitless
};

} // namespace ZorvaTouch

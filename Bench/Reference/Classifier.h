#pragma once

#include "Bench/Reference/Channels.h"

#include <vector>

namespace ZorvaTouch::Reference {

/// The linear classifier over the channels' values, ranked from the strongest to the weakest.
class Classifier {
public:
    /// Scores one frame: 0 if hardly anything is above the floor.
    void updateScore(const std::vector<Pixel> &pixels, const std::vector<VirtualPixel> &virtualPixels,
                     float activationThreshold);
    [[nodiscard]] float score() const { return _score; }

private:
    float _score = 0;
};

} // namespace ZorvaTouch::Reference

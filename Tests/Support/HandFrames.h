#pragma once

#include "Shared/HandStats.h"

#include "Tests/Support/Channels.h"

#include <cstdint>

namespace ZorvaTouch::Testing {

/// Makes the hand's classifier give this score in every frame in which it runs at all (the strongest channel
/// above the activation threshold, or two above the noise floor): without weights only the constant term is
/// left.
inline void giveEveryFrameTheScore(HandStats &hand, float score) {
    hand.svm.weights.fill(0.0f);
    hand.svm.bias = score;
}

/// One frame of the hand, at this time.
inline void step(HandStats &hand, const Channels &channels, std::uint32_t timeMs) {
    hand.updateHandState(channels.pixels, channels.virtualPixels, timeMs);
}

} // namespace ZorvaTouch::Testing

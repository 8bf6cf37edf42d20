#pragma once

#include "Bench/Reference/Channels.h"
#include "Bench/Reference/Classifier.h"

#include <cstdint>
#include <vector>

namespace ZorvaTouch::Reference {

/// The hand: touching, where, for how long, as a hold, as a tap. The real model's `HandStats` explains the
/// fields. Times are sensor milliseconds; differences wrap.
class Hand {
public:
    /// One frame. The vectors are copies of its own.
    void update(std::vector<Pixel> pixels, std::vector<VirtualPixel> virtualPixels, std::uint32_t now);
    /// Forgets the strongest channel and the score of the touch.
    void reset();

    // Tunables.
    float activationThreshold = 200.0f;
    std::uint32_t holdTimeoutMs = 500;
    bool enableHoldSuppression = true;
    bool enableTapSuppression = true;

    float touchScore = 0;
    bool isTouching = false, wasTouching = false;
    bool isAboveFloor = false, wasAboveFloor = false;
    bool isHolding = false, wasHolding = false;
    bool isHoldSuppressed = false, wasHoldSuppressed = false;
    bool isTapCandidate = false;
    bool isTap = false;
    bool isTapRejected = false;
    bool isPastHoldTimeout = false, wasPastHoldTimeout = false;
    std::uint32_t touchStartTime = 0, touchEndTime = 0;
    std::uint32_t floorStartTime = 0, floorEndTime = 0;
    std::uint32_t lastEventTime = 0;
    float strengthDurationRatio = 0;
    float touchStrengthDurationRatio = 0;
    float timeDurationRatio = 0;
    std::int32_t nonActivePixels = 0;
    float tapSvmScore = 0;
    Region activeRegion = kRegionNone;
    Region previousActiveRegion = kRegionNone;

private:
    using Pixels = std::vector<Pixel>;
    using VirtualPixels = std::vector<VirtualPixel>;

    struct Scan {
        bool anyAboveFloor = false;
        bool anyTouched = false;
        float best = 0;
        std::int32_t bestIndex = 0; ///< electrode of the strongest channel in this frame
    };

    void scanChannel(const Pixel &pixel, Scan &scan);
    [[nodiscard]] Scan scanChannels(const Pixels &pixels, const VirtualPixels &virtualPixels);
    void stampEdges(std::uint32_t now);
    void decideHold(std::uint32_t now);
    void decideTap(bool wasPastTimeout);

    [[nodiscard]] Region findRegion(const Pixels &pixels, const VirtualPixels &virtualPixels,
                                    std::uint32_t now);
    [[nodiscard]] Region changeRegion(const Pixels &pixels, std::int32_t index);
    void updateRegionMax(const Pixels &pixels);
    [[nodiscard]] float timeBiasFactor(std::uint32_t now) const;

    void updateTouchScore(const Pixels &pixels, const VirtualPixels &virtualPixels, std::uint32_t now);
    void decayTouchScore(std::uint32_t now);
    void updateTapRejection(const Pixels &pixels, const VirtualPixels &virtualPixels);

    Classifier _classifier;
    Region _lastEventRegion = kRegionNone;
    float _maxTouchedValue = 0;
    std::int32_t _maxTouchedIndex = 0;
    std::vector<float> _regionMax{0, 0, 0, 0};
};

} // namespace ZorvaTouch::Reference

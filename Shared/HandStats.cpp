#include "Shared/HandStats.h"

#include "Shared/VirtualImage.h"

#include <algorithm>
#include <cmath>
#include <span>

namespace ZorvaTouch {
namespace {

constexpr float kDefaultDecayParameter = 7.389056f; // e^2

// Attraction of the last event's region, seconds and factors.
constexpr float kBiasFullUntil = 0.3f;
constexpr float kBiasGoneFrom = 1.0f;
constexpr float kBiasStrongest = 0.65f;
constexpr float kBiasNone = 1.0f;

// Electrode K and the neighbours that speak for a side of it.
constexpr std::int32_t kElectrodeI = 8;
constexpr std::int32_t kElectrodeK = 10;
constexpr std::int32_t kElectrodeM = 12;
constexpr float kNeighbourShare = 0.7f; // of K's strength that the group of K and the neighbour must exceed

// Moving a hold: how much the candidate must gain, by how much the current region fell.
constexpr float kSmallDrop = 0.2f;
constexpr float kLargeDrop = 0.5f;
constexpr float kGainAfterSmallDrop = 1.3f;
constexpr float kGainAfterLargeDrop = 5.0f;

// Tap rejection: offsets of the features and weights of the linear score.
constexpr float kStrengthDurationOffset = 0.51f;
constexpr float kTimeDurationOffset = 0.25f;
constexpr float kTouchStrengthDurationOffset = 0.65f;
constexpr std::int32_t kMaxBystanders = 21; // channels above the floor that were never touched
constexpr float kNonActivePixelsWeight = 0.1886f;
constexpr float kStrengthDurationWeight = 0.2772f;
constexpr float kTimeDurationWeight = 2.7205f;
constexpr float kTapScoreOffset = 2.4116f;

/// The two electrodes with the largest `maxNormalizedValue`; the lower index first among equals.
struct StrongestPair {
    const Pixel &top;
    const Pixel &second;
};

StrongestPair findStrongestPair(const Pixels &pixels) noexcept {
    const Pixel *top = &pixels[0];
    const Pixel *second = nullptr;
    for (const Pixel &pixel : std::span(pixels).subspan(1)) {
        if (pixel.maxNormalizedValue > top->maxNormalizedValue) {
            second = top;
            top = &pixel;
        } else if (!second || pixel.maxNormalizedValue > second->maxNormalizedValue) {
            second = &pixel;
        }
    }
    return {*top, *second};
}

/// Region that the neighbours of electrode K pull it to; `region` if neither does.
PixelRegion pullFromElectrodeK(PixelRegion region, const StrongestPair &strongest,
                               const VirtualPixels &virtualPixels, float bias,
                               PixelRegion lastRegion) noexcept {
    struct Pull {
        std::int32_t neighbour;
        std::size_t group;
        PixelRegion towards;
    };
    static constexpr Pull kPulls[] = {{kElectrodeM, kVirtualPixelKLM, kPixelRegionVolumeDown},
                                      {kElectrodeI, kVirtualPixelIJK, kPixelRegionVolumeUp}};
    for (const Pull &pull : kPulls) {
        if (strongest.second.index != pull.neighbour)
            continue;
        const float share = lastRegion == pull.towards ? std::min(bias, kNeighbourShare) : kNeighbourShare;
        if (virtualPixels[pull.group].maxNormalizedValue > share * strongest.top.maxNormalizedValue)
            return pull.towards;
    }
    return region;
}

/// Electrode of the channel with the largest positive normalized value; 0 if none is positive.
std::int32_t findStrongestElectrode(const Pixels &pixels, const VirtualPixels &virtualPixels) noexcept {
    float best = 0;
    std::int32_t bestIndex = 0;
    const auto look = [&](const Pixel &pixel) {
        if (pixel.normalizedValue > best) {
            best = pixel.normalizedValue;
            bestIndex = pixel.index;
        }
    };
    std::for_each(pixels.begin(), pixels.end(), look);
    std::for_each(virtualPixels.begin(), virtualPixels.end(), look);
    return bestIndex;
}

template <typename Channels> std::int32_t countBystanders(const Channels &channels) noexcept {
    return static_cast<std::int32_t>(std::count_if(channels.begin(), channels.end(), [](const Pixel &pixel) {
        return pixel.wasAboveFloor && !pixel.wasTouched;
    }));
}

} // namespace

/// What one pass over all channels finds.
struct HandStats::FrameScan {
    bool anyAbove = false;
    bool anyTouched = false;
};

void HandStats::SetDecayParameters() noexcept { decayParameter = kDefaultDecayParameter; }

void HandStats::Reset() noexcept {
    touchScore = 0;
    tapStrength = 0;
    maxTouchedValue = 0;
    maxTouchedIndex = 0;
}

void HandStats::updateHandState(const Pixels &pixels, const VirtualPixels &virtualPixels,
                                std::uint32_t now) noexcept {
    const FrameScan scan = scanChannels(pixels, virtualPixels);
    updateTouching(scan);
    if (isTouching)
        activeRegion = isHolding ? changeActiveRegion(pixels, findStrongestElectrode(pixels, virtualPixels))
                                 : updateActiveRegion(pixels, virtualPixels, now);
    updateEdgeTimes(now);
    updateTouchScore(pixels, virtualPixels, now);
    updateTapRejection(pixels, virtualPixels);
    decideHold(now);
    decideTap();
    noteLastEvent(now);
}

HandStats::FrameScan HandStats::scanChannels(const Pixels &pixels,
                                             const VirtualPixels &virtualPixels) noexcept {
    FrameScan scan;
    const auto look = [this, &scan](const Pixel &pixel) {
        scan.anyAbove |= pixel.isAboveFloor;
        if (!pixel.isTouched)
            return;
        scan.anyTouched = true;
        if (pixel.normalizedValue > maxTouchedValue) { // which is 0 at least: negative values never count
            maxTouchedValue = pixel.normalizedValue;
            maxTouchedIndex = pixel.index;
        }
    };
    std::for_each(pixels.begin(), pixels.end(), look);
    std::for_each(virtualPixels.begin(), virtualPixels.end(), look);
    return scan;
}

void HandStats::updateTouching(const FrameScan &scan) noexcept {
    wasTouching = isTouching;
    isTouching = scan.anyTouched;
    wasAboveFloor = isAboveFloor;
    isAboveFloor = scan.anyAbove;
}

void HandStats::updateEdgeTimes(std::uint32_t now) noexcept {
    if (isAboveFloor && !wasAboveFloor)
        floorStartTime = now;
    if (!isAboveFloor && wasAboveFloor)
        floorEndTime = now;
    if (isTouching && !wasTouching)
        touchStartTime = now;
    if (!isTouching && wasTouching)
        touchEndTime = now;
}

void HandStats::decideHold(std::uint32_t now) noexcept {
    wasHolding = isHolding;
    wasPastHoldTimeout = isPastHoldTimeout;
    wasHoldSuppressed = isHoldSuppressed;

    const bool timedOut = isTouching && now - touchStartTime > holdTimeoutMs;
    if (!enableHoldSuppression) {
        isHolding = timedOut; // the suppression's own flags are left as they are; that is meant
        return;
    }
    isHolding = timedOut && (wasHolding || touchScore >= touchScoreThreshold);
    isHoldSuppressed = timedOut && !wasHolding && touchScore < touchScoreThreshold;
    isPastHoldTimeout = timedOut;
}

void HandStats::decideTap() noexcept {
    const bool released = !isTouching && wasTouching;
    // With hold suppression off the time-out is not tracked, so the end of a long hold is a candidate too;
    // the event decision lets the hold end mask it.
    isTapCandidate = released && !wasPastHoldTimeout;
    isTap = isTapCandidate && !(enableTapSuppression && isTapRejected);
    if (enableTapSuppression && !isTapCandidate)
        isTapRejected = false;
}

void HandStats::noteLastEvent(std::uint32_t now) noexcept {
    const bool holdEnded = wasHolding && !isHolding;
    if (!isTap && !holdEnded)
        return;
    lastEventTime = now;
    lastEventRegion = activeRegion;
}

float HandStats::updateTimeBiasFactor(std::uint32_t now) const noexcept {
    const auto seconds = static_cast<float>((now - lastEventTime) * 0.001);
    return fuzzifyAndClip(seconds, kBiasFullUntil, kBiasGoneFrom, kBiasStrongest, kBiasNone);
}

PixelRegion HandStats::updateActiveRegion(const Pixels &pixels, const VirtualPixels &virtualPixels,
                                          std::uint32_t now) noexcept {
    PixelRegion region = regionOfElectrode(maxTouchedIndex);
    const StrongestPair strongest = findStrongestPair(pixels);
    const auto &[top, second] = strongest;
    const float bias = updateTimeBiasFactor(now);
    const float floor = static_cast<float>(kNoiseFloor) / activationThreshold;
    const bool secondCounts = second.maxNormalizedValue > floor;

    const bool secondIsLastRegion = region != lastEventRegion && secondCounts &&
                                    top.getPixelRegion() == region &&
                                    second.getPixelRegion() == lastEventRegion;
    if (secondIsLastRegion && second.maxNormalizedValue > top.maxNormalizedValue * bias)
        region = lastEventRegion;

    if (maxTouchedIndex == kElectrodeK && top.index == kElectrodeK && secondCounts)
        region = pullFromElectrodeK(region, strongest, virtualPixels, bias, lastEventRegion);

    updateRegionMax(pixels);
    return region;
}

PixelRegion HandStats::changeActiveRegion(const Pixels &pixels, std::int32_t index) noexcept {
    const PixelRegion current = activeRegion;
    previousActiveRegion = current;
    const PixelRegion candidate = regionOfElectrode(index);
    if (candidate == current)
        return current;
    if (current == kPixelRegionNone || candidate == kPixelRegionNone)
        return candidate;

    const float oldCurrent = regionMax[current];
    const float oldRatio = oldCurrent > 0.0f ? regionMax[candidate] / oldCurrent : 0.0f;
    updateRegionMax(pixels);
    const float newCurrent = regionMax[current];
    const float drop = oldCurrent > 0.0f ? std::max(oldCurrent - newCurrent, 0.0f) / oldCurrent : 0.0f;
    if (newCurrent <= 0.0f)
        return candidate;

    regionSwitchFactor =
        fuzzifyAndClip(drop, kSmallDrop, kLargeDrop, kGainAfterSmallDrop, kGainAfterLargeDrop);
    const float newRatio = regionMax[candidate] / newCurrent;
    // "Not less" rather than "greater" is meant: from nothing (old ratio 0) even nothing (new ratio 0) moves
    // it.
    return newRatio >= oldRatio * regionSwitchFactor ? candidate : current;
}

void HandStats::updateRegionMax(const Pixels &pixels) noexcept {
    regionMax.fill(0.0f);
    for (const Pixel &pixel : pixels) {
        const PixelRegion region = pixel.getPixelRegion();
        const float excess = static_cast<float>(pixel.value) - static_cast<float>(kNoiseFloor);
        if (region != kPixelRegionNone && excess > 0.0f)
            regionMax[region] = std::max(regionMax[region], excess);
    }
}

void HandStats::updateTouchScore(const Pixels &pixels, const VirtualPixels &virtualPixels,
                                 std::uint32_t now) noexcept {
    svm.updateSVMScore(pixels, virtualPixels, activationThreshold, now);
    const bool episodeBegins = isAboveFloor && !wasAboveFloor;
    if (episodeBegins && touchScore != 0.0f)
        decayTouchScore(now);
    touchScore += svm.getSVMScore();
    if (touchScore > touchScoreLimit)
        touchScore = touchScoreLimit;
    if (touchScore < -touchScoreLimit)
        touchScore = -touchScoreLimit;
}

void HandStats::decayTouchScore(std::uint32_t now) noexcept {
    const std::uint32_t gap = now - floorEndTime - 1; // wraps: a gap of 0 ms counts as 2^32 - 1
    const double kept =
        1.0 - std::exp(static_cast<double>(gap)) / (static_cast<double>(decayParameter) - 1.0);
    const double magnitude = std::max(0.0, kept * static_cast<double>(std::fabs(touchScore)));
    touchScore = static_cast<float>(std::copysign(magnitude, static_cast<double>(touchScore)));
}

void HandStats::updateTapRejection(const Pixels &pixels, const VirtualPixels &virtualPixels) noexcept {
    tapStrength = maxTouchedValue * activationThreshold;

    const std::uint32_t sinceFloorStart = touchEndTime - floorStartTime;
    const std::uint32_t sinceLastEvent = touchEndTime - lastEventTime;
    const auto span = static_cast<float>(std::min(sinceFloorStart, sinceLastEvent)); // ms
    const auto touchDuration = static_cast<float>(touchEndTime - touchStartTime);    // ms

    strengthDurationRatio = 0;
    touchStrengthDurationRatio = 0;
    timeDurationRatio = 0;
    if (span != 0.0f) {
        strengthDurationRatio = tapStrength / span - kStrengthDurationOffset;
        timeDurationRatio = touchDuration / span - kTimeDurationOffset;
    }
    if (touchEndTime != touchStartTime)
        touchStrengthDurationRatio = tapStrength / touchDuration - kTouchStrengthDurationOffset;

    const std::int32_t bystanders = countBystanders(pixels) + countBystanders(virtualPixels);
    nonActivePixels = kMaxBystanders - bystanders;
    tapSvmScore = kNonActivePixelsWeight * static_cast<float>(nonActivePixels) +
                  kStrengthDurationWeight * strengthDurationRatio + kTimeDurationWeight * timeDurationRatio -
                  kTapScoreOffset;
    isTapRejected = tapSvmScore < 0.0f || timeDurationRatio < 0.0f || bystanders > kMaxBystanders ||
                    strengthDurationRatio < 0.0f || touchStrengthDurationRatio <= 0.0f;
}

float HandStats::fuzzify(float x, float x0, float x1, float y0, float y1) noexcept {
    const float u = (x - x0) / (x1 - x0);
    return y1 * u + y0 * (1.0f - u);
}

float HandStats::fuzzifyAndClip(float x, float x0, float x1, float y0, float y1) noexcept {
    if (x <= x0)
        return y0;
    if (x >= x1)
        return y1;
    return fuzzify(x, x0, x1, y0, y1);
}

} // namespace ZorvaTouch

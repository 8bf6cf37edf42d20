#include "Bench/Reference/Hand.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace ZorvaTouch::Reference {
namespace {

constexpr float kFloor = 75.0f;              // scaled sensor counts
constexpr float kDecayParameter = 7.389056f; // e squared
constexpr float kTouchScoreThreshold = 0.0f;
constexpr float kTouchScoreLimit = 100.0f;
constexpr std::int32_t kMostNonActive = 21;

constexpr std::int32_t kElectrodeI = 8;
constexpr std::int32_t kElectrodeK = 10;
constexpr std::int32_t kElectrodeM = 12;
constexpr std::size_t kGroupIJK = 18;
constexpr std::size_t kGroupKLM = 19;

float fuzzify(float x, float x0, float x1, float y0, float y1) {
    const float u = (x - x0) / (x1 - x0);
    return y1 * u + y0 * (1.0f - u);
}

float fuzzifyAndClip(float x, float x0, float x1, float y0, float y1) {
    if (x <= x0)
        return y0;
    if (x >= x1)
        return y1;
    return fuzzify(x, x0, x1, y0, y1);
}

bool isStrongerSoFar(const Pixel &left, const Pixel &right) {
    if (left.maxNormalizedValue != right.maxNormalizedValue)
        return left.maxNormalizedValue > right.maxNormalizedValue;
    return left.index < right.index;
}

bool isNonActive(const Pixel &pixel) { return pixel.wasAboveFloor && !pixel.wasTouched; }

} // namespace

void Hand::reset() {
    touchScore = 0;
    _maxTouchedValue = 0;
    _maxTouchedIndex = 0;
}

void Hand::update(std::vector<Pixel> pixels, std::vector<VirtualPixel> virtualPixels, std::uint32_t now) {
    const Scan scan = scanChannels(pixels, virtualPixels);
    wasTouching = std::exchange(isTouching, scan.anyTouched);
    wasAboveFloor = std::exchange(isAboveFloor, scan.anyAboveFloor);
    if (isTouching)
        activeRegion =
            isHolding ? changeRegion(pixels, scan.bestIndex) : findRegion(pixels, virtualPixels, now);
    stampEdges(now);
    updateTouchScore(pixels, virtualPixels, now);
    updateTapRejection(pixels, virtualPixels);

    wasHolding = isHolding;
    wasPastHoldTimeout = isPastHoldTimeout;
    wasHoldSuppressed = isHoldSuppressed;
    decideHold(now);
    decideTap(wasPastHoldTimeout);
    if (isTap || (wasHolding && !isHolding)) {
        lastEventTime = now;
        _lastEventRegion = activeRegion;
    }
}

void Hand::scanChannel(const Pixel &pixel, Scan &scan) {
    const float strength = std::max(pixel.normalizedValue, 0.0f);
    scan.anyAboveFloor = scan.anyAboveFloor || pixel.isAboveFloor;
    if (strength > scan.best) {
        scan.best = strength;
        scan.bestIndex = pixel.index;
    }
    if (!pixel.isTouched)
        return;
    scan.anyTouched = true;
    if (strength > _maxTouchedValue) {
        _maxTouchedValue = strength;
        _maxTouchedIndex = pixel.index;
    }
}

Hand::Scan Hand::scanChannels(const Pixels &pixels, const VirtualPixels &virtualPixels) {
    Scan scan;
    for (const Pixel &pixel : pixels)
        scanChannel(pixel, scan);
    for (const VirtualPixel &pixel : virtualPixels)
        scanChannel(pixel, scan);
    return scan;
}

void Hand::stampEdges(std::uint32_t now) {
    if (isAboveFloor && !wasAboveFloor)
        floorStartTime = now;
    if (!isAboveFloor && wasAboveFloor)
        floorEndTime = now;
    if (isTouching && !wasTouching)
        touchStartTime = now;
    if (!isTouching && wasTouching)
        touchEndTime = now;
}

void Hand::decideHold(std::uint32_t now) {
    const bool isTimedOut = isTouching && now - touchStartTime > holdTimeoutMs;
    if (!enableHoldSuppression) {
        isHolding = isTimedOut;
        return; // the other two flags are not maintained
    }
    isHolding = isTimedOut && (wasHolding || touchScore >= kTouchScoreThreshold);
    isHoldSuppressed = isTimedOut && !wasHolding && touchScore < kTouchScoreThreshold;
    isPastHoldTimeout = isTimedOut;
}

void Hand::decideTap(bool wasPastTimeout) {
    const bool isReleased = !isTouching && wasTouching;
    isTapCandidate = isReleased && !wasPastTimeout;
    if (!enableTapSuppression) {
        isTap = isTapCandidate;
        return;
    }
    isTap = isTapCandidate && !isTapRejected;
    if (!isTapCandidate)
        isTapRejected = false;
}

float Hand::timeBiasFactor(std::uint32_t now) const {
    const auto seconds = static_cast<float>((now - lastEventTime) * 0.001);
    return fuzzifyAndClip(seconds, 0.3f, 1.0f, 0.65f, 1.0f);
}

Region Hand::findRegion(const Pixels &pixels, const VirtualPixels &virtualPixels, std::uint32_t now) {
    Region region = regionOf(_maxTouchedIndex);

    std::vector<Pixel> ranked = pixels;
    std::sort(ranked.begin(), ranked.end(), isStrongerSoFar);
    const Pixel &top = ranked[0];
    const Pixel &second = ranked[1];

    const float bias = timeBiasFactor(now);
    const float floor = kFloor / activationThreshold;
    const bool secondCounts = second.maxNormalizedValue > floor;

    if (region != _lastEventRegion && secondCounts && top.region() == region &&
        second.region() == _lastEventRegion && second.maxNormalizedValue > top.maxNormalizedValue * bias)
        region = _lastEventRegion;

    if (_maxTouchedIndex == kElectrodeK && top.index == kElectrodeK && secondCounts) {
        if (second.index == kElectrodeM) {
            const float factor = _lastEventRegion == kRegionVolumeDown ? std::min(bias, 0.7f) : 0.7f;
            if (virtualPixels[kGroupKLM].maxNormalizedValue > factor * top.maxNormalizedValue)
                region = kRegionVolumeDown;
        } else if (second.index == kElectrodeI) {
            const float factor = _lastEventRegion == kRegionVolumeUp ? std::min(bias, 0.7f) : 0.7f;
            if (virtualPixels[kGroupIJK].maxNormalizedValue > factor * top.maxNormalizedValue)
                region = kRegionVolumeUp;
        }
    }

    updateRegionMax(pixels);
    return region;
}

Region Hand::changeRegion(const Pixels &pixels, std::int32_t index) {
    const Region current = activeRegion;
    previousActiveRegion = current;
    const Region candidate = regionOf(index);
    if (candidate == current)
        return current;
    if (current == kRegionNone || candidate == kRegionNone)
        return candidate;

    const float oldCurrent = _regionMax[current];
    const float oldRatio = oldCurrent > 0 ? _regionMax[candidate] / oldCurrent : 0;
    updateRegionMax(pixels);
    const float newCurrent = _regionMax[current];
    const float drop = oldCurrent > 0 ? std::max(oldCurrent - newCurrent, 0.0f) / oldCurrent : 0;
    if (newCurrent <= 0)
        return candidate;
    const float switchFactor = fuzzifyAndClip(drop, 0.2f, 0.5f, 1.3f, 5.0f);
    const float newRatio = _regionMax[candidate] / newCurrent;
    return newRatio >= oldRatio * switchFactor ? candidate : current;
}

void Hand::updateRegionMax(const Pixels &pixels) {
    std::fill(_regionMax.begin(), _regionMax.end(), 0.0f);
    for (const Pixel &pixel : pixels) {
        const Region region = pixel.region();
        const float height = static_cast<float>(pixel.value) - kFloor;
        if (region != kRegionNone && height > 0)
            _regionMax[region] = std::max(_regionMax[region], height);
    }
}

void Hand::updateTouchScore(const Pixels &pixels, const VirtualPixels &virtualPixels, std::uint32_t now) {
    _classifier.updateScore(pixels, virtualPixels, activationThreshold);
    if (isAboveFloor && !wasAboveFloor && touchScore != 0)
        decayTouchScore(now);
    touchScore = std::clamp(touchScore + _classifier.score(), -kTouchScoreLimit, kTouchScoreLimit);
}

void Hand::decayTouchScore(std::uint32_t now) {
    const std::uint32_t gapMs = now - floorEndTime - 1;
    const double keep =
        1.0 - std::exp(static_cast<double>(gapMs)) / (static_cast<double>(kDecayParameter) - 1.0);
    const double size = std::max(0.0, keep * std::abs(static_cast<double>(touchScore)));
    touchScore = static_cast<float>(std::signbit(touchScore) ? -size : size);
}

void Hand::updateTapRejection(const Pixels &pixels, const VirtualPixels &virtualPixels) {
    const float tapStrength = _maxTouchedValue * activationThreshold;
    const std::uint32_t span = std::min(touchEndTime - floorStartTime, touchEndTime - lastEventTime);
    const auto touchDuration = static_cast<float>(touchEndTime - touchStartTime);

    strengthDurationRatio = 0;
    timeDurationRatio = 0;
    touchStrengthDurationRatio = 0;
    if (span != 0) {
        strengthDurationRatio = tapStrength / static_cast<float>(span) - 0.51f;
        timeDurationRatio = touchDuration / static_cast<float>(span) - 0.25f;
    }
    if (touchEndTime != touchStartTime)
        touchStrengthDurationRatio = tapStrength / touchDuration - 0.65f;

    const auto count =
        static_cast<std::int32_t>(std::count_if(pixels.begin(), pixels.end(), isNonActive) +
                                  std::count_if(virtualPixels.begin(), virtualPixels.end(), isNonActive));
    nonActivePixels = kMostNonActive - count;
    tapSvmScore = 0.1886f * static_cast<float>(nonActivePixels) + 0.2772f * strengthDurationRatio +
                  2.7205f * timeDurationRatio - 2.4116f;
    isTapRejected = tapSvmScore < 0 || timeDurationRatio < 0 || count > kMostNonActive ||
                    strengthDurationRatio < 0 || touchStrengthDurationRatio <= 0;
}

} // namespace ZorvaTouch::Reference

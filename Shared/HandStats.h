#pragma once

#include "Shared/Pixel.h"
#include "Shared/SVM.h"

#include <array>
#include <cstdint>

namespace ZorvaTouch {

/// Follows the hand: is the sensor touched and where, how long, is it a hold, is it meant, was the release a
/// tap.
///
/// All times are the sensor's milliseconds, 32 bits unsigned; differences wrap and never become negative.
/// The fields are the state; hosts of the class read them after each frame.
///
/// Threads: none of its own; the caller serialises.
class HandStats {
public:
    SVM svm;

    float touchScore = 0;               ///< accumulated classifier score, clipped to +-`touchScoreLimit`
    float decayParameter = 7.389056f;   ///< e^2, base of the score's decay between episodes above the floor
    float activationThreshold = 200.0f; ///< scaled counts; state key "ActivationThreshold"
    std::uint32_t holdTimeoutMs = 500;  ///< a longer touch is a hold; state key "HoldTimeoutMilliseconds"
    float touchScoreThreshold = 0.0f;   ///< a hold may begin only while `touchScore` is not below this
    float touchScoreLimit = 100.0f;
    float tapStrength = 0;             ///< `maxTouchedValue` in scaled counts
    bool enableHoldSuppression = true; ///< state key "EnableHoldSuppression"
    bool enableTapSuppression = true;  ///< state key "EnableTapSuppression"
    bool isTouching = false;           ///< some channel is touched
    bool wasTouching = false;  ///< `isTouching` of the previous frame; likewise the other was... fields
    bool isAboveFloor = false; ///< some channel is above the noise floor
    bool wasAboveFloor = false;
    bool isHolding = false; ///< the touch is a hold
    bool wasHolding = false;
    bool isHoldSuppressed = false; ///< past the hold time-out, but the touch score marks it as unintended
    bool wasHoldSuppressed = false;
    bool isTapCandidate = false;    ///< released in this frame, not past the hold time-out
    bool isTap = false;             ///< a tap is to be reported in this frame
    bool isTapRejected = false;     ///< the tap-rejection rule speaks against the current touch
    bool isPastHoldTimeout = false; ///< maintained only while hold suppression is on
    bool wasPastHoldTimeout = false;
    std::uint32_t touchStartTime = 0;            ///< `isTouching` last rose
    std::uint32_t touchEndTime = 0;              ///< `isTouching` last fell
    std::uint32_t floorStartTime = 0;            ///< `isAboveFloor` last rose
    std::uint32_t floorEndTime = 0;              ///< `isAboveFloor` last fell
    std::uint32_t lastEventTime = 0;             ///< last tap or hold end
    float strengthDurationRatio = 0;             ///< tap feature "sd", scaled counts per ms less an offset
    float touchStrengthDurationRatio = 0;        ///< tap feature "tsd", likewise
    float timeDurationRatio = 0;                 ///< tap feature "TimeDurationRatio", unitless
    std::int32_t nonActivePixels = 0;            ///< tap feature "NonActivePixels", channels
    float tapSvmScore = 0;                       ///< tap-rejection score "TapSVMScore"; negative rejects
    PixelRegion activeRegion = kPixelRegionNone; ///< of the current or last touch
    PixelRegion previousActiveRegion = kPixelRegionNone; ///< before the last region update of a hold
    PixelRegion lastEventRegion = kPixelRegionNone;      ///< at the last tap or hold end
    float maxTouchedValue = 0;        ///< largest normalized value of a touched channel since `Reset`
    std::int32_t maxTouchedIndex = 0; ///< that channel's electrode
    std::array<float, kPixelRegionCount>
        regionMax{};                 ///< strongest value above the floor by region, scaled counts
    float regionSwitchFactor = 1.3f; ///< last factor of `changeActiveRegion`, kept for inspection

    /// Sets `decayParameter` to its default again.
    void SetDecayParameters() noexcept;

    /// Begins a new measurement: clears the touch score, the tap strength and the strongest touched channel.
    void Reset() noexcept;

    /// Takes one frame.
    ///
    /// @param pixels, virtualPixels  All channels after their own update of this frame.
    /// @param now                    Frame time, ms.
    ///
    /// Realtime: yes; allocates nothing.
    void updateHandState(const Pixels &pixels, const VirtualPixels &virtualPixels,
                         std::uint32_t now) noexcept;

    /// Region of a touch that is not a hold: the strongest touched electrode's, pulled towards the region of
    /// the last event and, at electrode K, towards the side that its neighbours speak for.
    [[nodiscard]] PixelRegion updateActiveRegion(const Pixels &pixels, const VirtualPixels &virtualPixels,
                                                 std::uint32_t now) noexcept;

    /// Region of a hold: it moves only when the candidate has gained markedly on the current region in one
    /// frame.
    ///
    /// @param index  Electrode of the strongest channel; its region is the candidate.
    [[nodiscard]] PixelRegion changeActiveRegion(const Pixels &pixels, std::int32_t index) noexcept;

    void updateTouchScore(const Pixels &pixels, const VirtualPixels &virtualPixels,
                          std::uint32_t now) noexcept;
    void updateTapRejection(const Pixels &pixels, const VirtualPixels &virtualPixels) noexcept;

    /// Decays the touch score over the gap since the last episode above the floor.
    ///
    /// The curve is steep and meant so: 1 ms keeps 0.8435, 2 ms 0.5745, 3 ms and more nothing. A gap of 0 ms
    /// wraps and keeps nothing either.
    void decayTouchScore(std::uint32_t now) noexcept;

    /// How much the region of the last event attracts the next touch: 0.65 until 0.3 s after it, 1 (not at
    /// all) from 1 s on.
    [[nodiscard]] float updateTimeBiasFactor(std::uint32_t now) const noexcept;

    void updateRegionMax(const Pixels &pixels) noexcept;

    /// Linear interpolation from (x0, y0) to (x1, y1), not clipped.
    [[nodiscard]] static float fuzzify(float x, float x0, float x1, float y0, float y1) noexcept;
    /// As `fuzzify`, but y0 up to x0 and y1 from x1 on.
    [[nodiscard]] static float fuzzifyAndClip(float x, float x0, float x1, float y0, float y1) noexcept;

private:
    struct FrameScan;

    [[nodiscard]] FrameScan scanChannels(const Pixels &pixels, const VirtualPixels &virtualPixels) noexcept;
    void updateTouching(const FrameScan &scan) noexcept;
    void updateEdgeTimes(std::uint32_t now) noexcept;
    void decideHold(std::uint32_t now) noexcept;
    void decideTap() noexcept;
    void noteLastEvent(std::uint32_t now) noexcept;
};

} // namespace ZorvaTouch

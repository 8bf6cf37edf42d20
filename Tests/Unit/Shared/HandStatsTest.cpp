#include "Shared/HandStats.h"

#include "Tests/Support/HandFrames.h"

#include <limits>
#include <vector>

#include <gtest/gtest.h>

// What one frame does to the flags, the times and the strongest channel. Whole gestures are in
// HandStatsSequenceTest.cpp, the single steps in the files named after them.

namespace ZorvaTouch {
namespace {

using Testing::Channels;
using Testing::giveEveryFrameTheScore;
using Testing::step;

constexpr float kNan = std::numeric_limits<float>::quiet_NaN();

const Channels kIdle;
const Channels kFinger = Channels().press('A', 300);     // normalized 1.5, play/pause
const Channels kWeakFinger = Channels().press('A', 201); // too weak for its length, if it lasts

/// A hand whose frames all score +1: nothing is suppressed.
HandStats trustedHand() {
    HandStats hand;
    giveEveryFrameTheScore(hand, 1.0f);
    return hand;
}

/// A hand whose frames all score -1: no hold begins.
HandStats distrustedHand() {
    HandStats hand;
    giveEveryFrameTheScore(hand, -1.0f);
    return hand;
}

TEST(HandStats, StartsWithItsDefaults) {
    const HandStats hand;
    EXPECT_EQ(hand.touchScore, 0.0f);
    EXPECT_EQ(hand.decayParameter, 7.389056f);
    EXPECT_EQ(hand.activationThreshold, 200.0f);
    EXPECT_EQ(hand.holdTimeoutMs, 500u);
    EXPECT_EQ(hand.touchScoreThreshold, 0.0f);
    EXPECT_EQ(hand.touchScoreLimit, 100.0f);
    EXPECT_EQ(hand.tapStrength, 0.0f);
    EXPECT_TRUE(hand.enableHoldSuppression);
    EXPECT_TRUE(hand.enableTapSuppression);
    EXPECT_FALSE(hand.isTouching || hand.wasTouching || hand.isAboveFloor || hand.wasAboveFloor);
    EXPECT_FALSE(hand.isHolding || hand.wasHolding || hand.isHoldSuppressed || hand.wasHoldSuppressed);
    EXPECT_FALSE(hand.isTapCandidate || hand.isTap || hand.isTapRejected);
    EXPECT_FALSE(hand.isPastHoldTimeout || hand.wasPastHoldTimeout);
    EXPECT_EQ(hand.touchStartTime, 0u);
    EXPECT_EQ(hand.touchEndTime, 0u);
    EXPECT_EQ(hand.floorStartTime, 0u);
    EXPECT_EQ(hand.floorEndTime, 0u);
    EXPECT_EQ(hand.lastEventTime, 0u);
    EXPECT_EQ(hand.strengthDurationRatio, 0.0f);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 0.0f);
    EXPECT_EQ(hand.timeDurationRatio, 0.0f);
    EXPECT_EQ(hand.nonActivePixels, 0);
    EXPECT_EQ(hand.tapSvmScore, 0.0f);
    EXPECT_EQ(hand.activeRegion, kPixelRegionNone);
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionNone);
    EXPECT_EQ(hand.lastEventRegion, kPixelRegionNone);
    EXPECT_EQ(hand.maxTouchedValue, 0.0f);
    EXPECT_EQ(hand.maxTouchedIndex, 0);
    EXPECT_EQ(hand.regionMax, (std::array<float, 4>{0.0f, 0.0f, 0.0f, 0.0f}));
    EXPECT_EQ(hand.regionSwitchFactor, 1.3f);
    EXPECT_EQ(hand.svm.score, 0.0f);
    EXPECT_EQ(hand.svm.bias, 2.0083f);
}

TEST(HandStats, ResetClearsTheMeasurementAndNothingElse) {
    HandStats hand;
    hand.touchScore = 5;
    hand.tapStrength = 6;
    hand.maxTouchedValue = 7;
    hand.maxTouchedIndex = 8;

    hand.svm.score = 9;
    hand.decayParameter = 3;
    hand.activationThreshold = 150;
    hand.holdTimeoutMs = 400;
    hand.touchScoreThreshold = 1;
    hand.touchScoreLimit = 50;
    hand.enableHoldSuppression = hand.enableTapSuppression = false;
    hand.isTouching = hand.wasTouching = hand.isAboveFloor = hand.wasAboveFloor = true;
    hand.isHolding = hand.wasHolding = hand.isHoldSuppressed = hand.wasHoldSuppressed = true;
    hand.isTapCandidate = hand.isTap = hand.isTapRejected = true;
    hand.isPastHoldTimeout = hand.wasPastHoldTimeout = true;
    hand.touchStartTime = 11;
    hand.touchEndTime = 12;
    hand.floorStartTime = 13;
    hand.floorEndTime = 14;
    hand.lastEventTime = 15;
    hand.strengthDurationRatio = 16;
    hand.touchStrengthDurationRatio = 17;
    hand.timeDurationRatio = 18;
    hand.nonActivePixels = 19;
    hand.tapSvmScore = 20;
    hand.activeRegion = kPixelRegionPlayPause;
    hand.previousActiveRegion = kPixelRegionVolumeDown;
    hand.lastEventRegion = kPixelRegionVolumeUp;
    hand.regionMax = {0, 21, 22, 23};
    hand.regionSwitchFactor = 24;

    hand.Reset();

    EXPECT_EQ(hand.touchScore, 0.0f);
    EXPECT_EQ(hand.tapStrength, 0.0f);
    EXPECT_EQ(hand.maxTouchedValue, 0.0f);
    EXPECT_EQ(hand.maxTouchedIndex, 0);

    EXPECT_EQ(hand.svm.score, 9.0f);
    EXPECT_EQ(hand.decayParameter, 3.0f);
    EXPECT_EQ(hand.activationThreshold, 150.0f);
    EXPECT_EQ(hand.holdTimeoutMs, 400u);
    EXPECT_EQ(hand.touchScoreThreshold, 1.0f);
    EXPECT_EQ(hand.touchScoreLimit, 50.0f);
    EXPECT_FALSE(hand.enableHoldSuppression || hand.enableTapSuppression);
    EXPECT_TRUE(hand.isTouching && hand.wasTouching && hand.isAboveFloor && hand.wasAboveFloor);
    EXPECT_TRUE(hand.isHolding && hand.wasHolding && hand.isHoldSuppressed && hand.wasHoldSuppressed);
    EXPECT_TRUE(hand.isTapCandidate && hand.isTap && hand.isTapRejected);
    EXPECT_TRUE(hand.isPastHoldTimeout && hand.wasPastHoldTimeout);
    EXPECT_EQ(hand.touchStartTime, 11u);
    EXPECT_EQ(hand.touchEndTime, 12u);
    EXPECT_EQ(hand.floorStartTime, 13u);
    EXPECT_EQ(hand.floorEndTime, 14u);
    EXPECT_EQ(hand.lastEventTime, 15u);
    EXPECT_EQ(hand.strengthDurationRatio, 16.0f);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 17.0f);
    EXPECT_EQ(hand.timeDurationRatio, 18.0f);
    EXPECT_EQ(hand.nonActivePixels, 19);
    EXPECT_EQ(hand.tapSvmScore, 20.0f);
    EXPECT_EQ(hand.activeRegion, kPixelRegionPlayPause);
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionVolumeDown);
    EXPECT_EQ(hand.lastEventRegion, kPixelRegionVolumeUp);
    EXPECT_EQ(hand.regionMax, (std::array<float, 4>{0.0f, 21.0f, 22.0f, 23.0f}));
    EXPECT_EQ(hand.regionSwitchFactor, 24.0f);
}

TEST(HandStats, AnyTouchedChannelIsATouch) {
    for (std::size_t i = 0; i < 38; ++i) {
        Channels channels;
        (i < 15 ? channels.pixels[i] : channels.virtualPixels.at(i - 15)).isTouched = true;
        HandStats hand;
        step(hand, channels, 1000);
        EXPECT_TRUE(hand.isTouching) << "channel " << i;
        EXPECT_FALSE(hand.isAboveFloor) << "channel " << i;
    }
}

TEST(HandStats, AnyChannelAboveTheFloorCounts) {
    for (std::size_t i = 0; i < 38; ++i) {
        Channels channels;
        (i < 15 ? channels.pixels[i] : channels.virtualPixels.at(i - 15)).isAboveFloor = true;
        HandStats hand;
        step(hand, channels, 1000);
        EXPECT_TRUE(hand.isAboveFloor) << "channel " << i;
        EXPECT_FALSE(hand.isTouching) << "channel " << i;
    }
}

TEST(HandStats, FlagsOfTheChannelsDecideNotTheirStickyOnes) {
    Channels channels;
    for (Pixel &pixel : channels.pixels) {
        pixel.wasTouched = pixel.wasAboveFloor = true;
        pixel.normalizedValue = 3.0f;
    }
    HandStats hand;
    step(hand, channels, 1000);
    EXPECT_FALSE(hand.isTouching);
    EXPECT_FALSE(hand.isAboveFloor);
}

TEST(HandStats, FlagsOfTheFrameBeforeAreKept) {
    HandStats hand = trustedHand();
    step(hand, kFinger, 1000);
    EXPECT_FALSE(hand.wasTouching);
    EXPECT_FALSE(hand.wasAboveFloor);
    step(hand, kIdle, 1010);
    EXPECT_TRUE(hand.wasTouching);
    EXPECT_TRUE(hand.wasAboveFloor);
    step(hand, kIdle, 1020);
    EXPECT_FALSE(hand.wasTouching);
    EXPECT_FALSE(hand.wasAboveFloor);
}

TEST(HandStats, StrongestTouchedChannelIsRememberedAcrossFrames) {
    HandStats hand;
    step(hand, Channels().press('C', 300).press('N', 320), 1000);
    EXPECT_EQ(hand.maxTouchedValue, 1.6f);
    EXPECT_EQ(hand.maxTouchedIndex, 13);
    step(hand, Channels().press('C', 310), 1010); // weaker
    EXPECT_EQ(hand.maxTouchedValue, 1.6f);
    EXPECT_EQ(hand.maxTouchedIndex, 13);
    step(hand, Channels().press('C', 320), 1020); // equal is not stronger
    EXPECT_EQ(hand.maxTouchedIndex, 13);
    step(hand, Channels().press('C', 400), 1030);
    EXPECT_EQ(hand.maxTouchedValue, 2.0f);
    EXPECT_EQ(hand.maxTouchedIndex, 2);
    step(hand, kIdle, 1040); // nor does the release clear it
    EXPECT_EQ(hand.maxTouchedValue, 2.0f);
    EXPECT_EQ(hand.maxTouchedIndex, 2);
}

TEST(HandStats, AmongEquallyStrongChannelsTheFirstIsRemembered) {
    Channels channels = Channels().press('E', 300).press('L', 300);
    channels.group("ABE").isTouched = true;
    channels.group("ABE").normalizedValue = 1.5f;
    channels.group("ABE").index = 1;
    HandStats hand;
    step(hand, channels, 1000);
    EXPECT_EQ(hand.maxTouchedValue, 1.5f);
    EXPECT_EQ(hand.maxTouchedIndex, 4);
}

TEST(HandStats, AGroupContributesItsDominantElectrode) {
    Channels channels = Channels().press('E', 300);
    channels.group("MNO").isTouched = true;
    channels.group("MNO").normalizedValue = 1.75f;
    channels.group("MNO").index = 13;
    HandStats hand;
    step(hand, channels, 1000);
    EXPECT_EQ(hand.maxTouchedValue, 1.75f);
    EXPECT_EQ(hand.maxTouchedIndex, 13);
    EXPECT_EQ(hand.activeRegion, kPixelRegionVolumeDown);
}

TEST(HandStats, UntouchedChannelsAreNotRemembered) {
    HandStats hand;
    step(hand, Channels().press('C', 300).brush('N', 900), 1000);
    EXPECT_EQ(hand.maxTouchedValue, 1.5f);
    EXPECT_EQ(hand.maxTouchedIndex, 2);
}

TEST(HandStats, NegativeAndNanStrengthsCountAsNothing) {
    for (const float strength : {-2.0f, 0.0f, kNan}) {
        Channels channels;
        channels.electrode('G').isTouched = true;
        channels.electrode('G').normalizedValue = strength;
        HandStats hand;
        step(hand, channels, 1000);
        EXPECT_TRUE(hand.isTouching);
        EXPECT_EQ(hand.maxTouchedValue, 0.0f);
        EXPECT_EQ(hand.maxTouchedIndex, 0);
    }
}

/// The region of the strongest channel: that is where a hold without a region goes.
PixelRegion regionOfStrongest(const Channels &channels) {
    HandStats hand = trustedHand();
    hand.isHolding = true;
    step(hand, channels, 1000);
    return hand.activeRegion;
}

TEST(HandStats, StrongestChannelOfAFrameNeedNotBeTouched) {
    EXPECT_EQ(regionOfStrongest(Channels().press('A', 300).brush('G', 301)), kPixelRegionVolumeUp);
    EXPECT_EQ(regionOfStrongest(Channels().press('A', 300).brush('G', 299)), kPixelRegionPlayPause);
}

TEST(HandStats, StrongestChannelOfAFrameMayBeAGroup) {
    Channels channels = Channels().press('A', 300);
    channels.group("LMN").normalizedValue = 1.75f;
    channels.group("LMN").index = 11;
    EXPECT_EQ(regionOfStrongest(channels), kPixelRegionVolumeDown);
    channels.group("LMN").normalizedValue = 1.5f; // equal: the electrode comes first
    EXPECT_EQ(regionOfStrongest(channels), kPixelRegionPlayPause);
}

TEST(HandStats, AmongEquallyStrongChannelsOfAFrameTheFirstCounts) {
    EXPECT_EQ(regionOfStrongest(Channels().press('G', 300).press('L', 300)), kPixelRegionVolumeUp);
    EXPECT_EQ(regionOfStrongest(Channels().press('L', 300).press('N', 300).press('K', 300)),
              kPixelRegionPlayPause);
}

TEST(HandStats, WithoutAnyStrengthTheFirstElectrodeCountsAsStrongest) {
    for (const float strength : {-2.0f, 0.0f, kNan}) {
        Channels channels;
        channels.electrode('G').isTouched = true;
        channels.electrode('G').normalizedValue = strength;
        EXPECT_EQ(regionOfStrongest(channels), kPixelRegionPlayPause); // electrode 0
    }
}

TEST(HandStats, RegionOfATouchFollowsTheStrongestChannelSoFar) {
    HandStats hand = trustedHand();
    step(hand, Channels().press('N', 400), 1000);
    EXPECT_EQ(hand.activeRegion, kPixelRegionVolumeDown);
    step(hand, Channels().press('A', 300), 1010); // N was stronger
    EXPECT_EQ(hand.activeRegion, kPixelRegionVolumeDown);
    step(hand, Channels().press('A', 500), 1020);
    EXPECT_EQ(hand.activeRegion, kPixelRegionPlayPause);
}

TEST(HandStats, RegionIsKeptWhileNothingIsTouched) {
    HandStats hand = trustedHand();
    step(hand, Channels().press('G', 300), 1000);
    EXPECT_EQ(hand.activeRegion, kPixelRegionVolumeUp);
    hand.regionMax = {0, 1, 2, 3};
    step(hand, Channels().brush('A', 100), 1010);
    EXPECT_EQ(hand.activeRegion, kPixelRegionVolumeUp);
    EXPECT_EQ(hand.regionMax, (std::array<float, 4>{0, 1, 2, 3})); // nothing of it is recomputed
    hand.isHolding = true;
    step(hand, Channels().brush('A', 100), 1020);
    EXPECT_EQ(hand.activeRegion, kPixelRegionVolumeUp);
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionNone);
}

TEST(HandStats, FirstFrameOfAHoldStillFindsItsRegionAsATouchDoes) {
    HandStats hand = trustedHand();
    step(hand, kFinger, 1000);
    step(hand, kFinger, 1501);
    ASSERT_TRUE(hand.isHolding);
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionNone); // no hold region was asked for yet
    step(hand, kFinger, 1510);
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionPlayPause);
}

struct EdgeRow {
    std::uint32_t timeMs;
    Channels channels;
    std::uint32_t floorStart, touchStart, touchEnd, floorEnd;
};

TEST(HandStats, EdgesStampTheirTimes) {
    const Channels brushed = Channels().brush('A', 100);
    const std::vector<EdgeRow> rows{
        {100, kIdle, 0, 0, 0, 0},           {110, brushed, 110, 0, 0, 0},
        {120, kFinger, 110, 120, 0, 0},     {130, kFinger, 110, 120, 0, 0},
        {140, brushed, 110, 120, 140, 0},   {150, brushed, 110, 120, 140, 0},
        {160, kIdle, 110, 120, 140, 160},   {170, kIdle, 110, 120, 140, 160},
        {180, kFinger, 180, 180, 140, 160}, // both at once
        {190, kIdle, 180, 180, 190, 190},
    };
    HandStats hand = trustedHand();
    for (const EdgeRow &row : rows) {
        SCOPED_TRACE(row.timeMs);
        step(hand, row.channels, row.timeMs);
        EXPECT_EQ(hand.floorStartTime, row.floorStart);
        EXPECT_EQ(hand.touchStartTime, row.touchStart);
        EXPECT_EQ(hand.touchEndTime, row.touchEnd);
        EXPECT_EQ(hand.floorEndTime, row.floorEnd);
    }
}

TEST(HandStats, HoldBeginsOneMillisecondAfterTheTimeout) {
    HandStats hand = trustedHand();
    step(hand, kFinger, 1000);
    EXPECT_FALSE(hand.isHolding);
    step(hand, kFinger, 1500);
    EXPECT_FALSE(hand.isHolding);
    EXPECT_FALSE(hand.isPastHoldTimeout);
    step(hand, kFinger, 1501);
    EXPECT_TRUE(hand.isHolding);
    EXPECT_TRUE(hand.isPastHoldTimeout);
    EXPECT_FALSE(hand.wasHolding);
    EXPECT_FALSE(hand.wasPastHoldTimeout);
}

TEST(HandStats, HoldTimeIsMeasuredInWrappingArithmetic) {
    HandStats hand = trustedHand();
    step(hand, kFinger, 4294967196u); // 100 ms before the clock wraps
    step(hand, kFinger, 400);
    EXPECT_FALSE(hand.isHolding);
    step(hand, kFinger, 401);
    EXPECT_TRUE(hand.isHolding);
}

TEST(HandStats, TimeRunningBackwardIsAVeryLongTouch) {
    HandStats hand = trustedHand();
    step(hand, kFinger, 1000);
    step(hand, kFinger, 999); // 2^32 - 1 ms later
    EXPECT_TRUE(hand.isHolding);
}

TEST(HandStats, AnyHoldTimeoutIsStrict) {
    HandStats hand = trustedHand();
    hand.holdTimeoutMs = 0;
    step(hand, kFinger, 1000);
    EXPECT_FALSE(hand.isHolding); // 0 ms are not more than 0
    step(hand, kFinger, 1001);
    EXPECT_TRUE(hand.isHolding);

    HandStats patient = trustedHand();
    patient.holdTimeoutMs = 4294967295u;
    step(patient, kFinger, 1000);
    step(patient, kFinger, 999); // the longest touch there is, 2^32 - 1 ms
    EXPECT_FALSE(patient.isHolding);
}

TEST(HandStats, HoldIsAllowedAtTheScoreThresholdAndSuppressedBelowIt) {
    for (const float threshold : {0.0f, 5.0f, -3.0f}) {
        HandStats hand;
        giveEveryFrameTheScore(hand, 0.0f);
        hand.touchScoreThreshold = threshold;
        step(hand, kFinger, 1000);
        hand.touchScore = threshold;
        step(hand, kFinger, 1501);
        EXPECT_TRUE(hand.isHolding) << threshold;
        EXPECT_FALSE(hand.isHoldSuppressed) << threshold;
        EXPECT_TRUE(hand.isPastHoldTimeout) << threshold;

        HandStats suppressed;
        giveEveryFrameTheScore(suppressed, 0.0f);
        suppressed.touchScoreThreshold = threshold;
        step(suppressed, kFinger, 1000);
        suppressed.touchScore = threshold - 0.25f;
        step(suppressed, kFinger, 1501);
        EXPECT_FALSE(suppressed.isHolding) << threshold;
        EXPECT_TRUE(suppressed.isHoldSuppressed) << threshold;
        EXPECT_TRUE(suppressed.isPastHoldTimeout) << threshold;
    }
}

TEST(HandStats, ScoreOfTheSameFrameDecidesTheHold) {
    HandStats hand;
    step(hand, kFinger, 1000);
    hand.touchScore = 1.0f;
    giveEveryFrameTheScore(hand, -1.5f);
    step(hand, kFinger, 1501); // 1 - 1.5 = -0.5
    EXPECT_FALSE(hand.isHolding);
    EXPECT_TRUE(hand.isHoldSuppressed);
}

TEST(HandStats, ABegunHoldSurvivesANegativeScore) {
    HandStats hand = trustedHand();
    step(hand, kFinger, 1000);
    step(hand, kFinger, 1501);
    ASSERT_TRUE(hand.isHolding);
    giveEveryFrameTheScore(hand, -50.0f);
    step(hand, kFinger, 1510);
    EXPECT_LT(hand.touchScore, 0.0f);
    EXPECT_TRUE(hand.isHolding);
    EXPECT_FALSE(hand.isHoldSuppressed);
}

TEST(HandStats, ANanScoreNeitherHoldsNorSuppresses) {
    HandStats hand;
    giveEveryFrameTheScore(hand, kNan);
    step(hand, kFinger, 1000);
    step(hand, kFinger, 1501);
    EXPECT_FALSE(hand.isHolding);
    EXPECT_FALSE(hand.isHoldSuppressed);
    EXPECT_TRUE(hand.isPastHoldTimeout);
}

TEST(HandStats, WithoutSuppressionEveryLongTouchIsAHold) {
    HandStats hand = distrustedHand();
    hand.enableHoldSuppression = false;
    step(hand, kFinger, 1000);
    step(hand, kFinger, 1500);
    EXPECT_FALSE(hand.isHolding);
    step(hand, kFinger, 1501);
    EXPECT_TRUE(hand.isHolding);
    EXPECT_FALSE(hand.isHoldSuppressed);
    EXPECT_FALSE(hand.isPastHoldTimeout); // tracked only while suppression is on
    step(hand, kIdle, 1600);
    EXPECT_FALSE(hand.isHolding);
    EXPECT_TRUE(hand.wasHolding);
}

TEST(HandStats, SwitchingSuppressionOffLeavesItsFlagsAsTheyAre) {
    HandStats hand = distrustedHand();
    step(hand, kFinger, 1000);
    step(hand, kFinger, 1501);
    ASSERT_TRUE(hand.isHoldSuppressed && hand.isPastHoldTimeout);
    hand.enableHoldSuppression = false;
    step(hand, kFinger, 1510);
    EXPECT_TRUE(hand.isHolding);
    EXPECT_TRUE(hand.isHoldSuppressed);
    EXPECT_TRUE(hand.isPastHoldTimeout);
    step(hand, kIdle, 1600);
    step(hand, kIdle, 1610);
    EXPECT_TRUE(hand.isHoldSuppressed); // stale, also with nothing touched: meant
    EXPECT_TRUE(hand.isPastHoldTimeout);
    EXPECT_TRUE(hand.wasHoldSuppressed);
    EXPECT_TRUE(hand.wasPastHoldTimeout);
    hand.enableHoldSuppression = true;
    step(hand, kIdle, 1620);
    EXPECT_FALSE(hand.isHoldSuppressed);
    EXPECT_FALSE(hand.isPastHoldTimeout);
    EXPECT_TRUE(hand.wasHoldSuppressed);
    EXPECT_TRUE(hand.wasPastHoldTimeout);
}

TEST(HandStats, ReleaseOfATouchThatLastedTheTimeoutExactlyIsATapCandidate) {
    HandStats hand = trustedHand();
    step(hand, kFinger, 1000);
    step(hand, kFinger, 1500);
    step(hand, kIdle, 1900); // the release frame itself may be as late as it likes
    EXPECT_TRUE(hand.isTapCandidate);
    EXPECT_FALSE(hand.isHolding);
    EXPECT_FALSE(hand.isPastHoldTimeout);
}

TEST(HandStats, ReleaseOfATouchBeyondTheTimeoutIsNoTapCandidate) {
    for (HandStats hand : {trustedHand(), distrustedHand()}) {
        step(hand, kFinger, 1000);
        step(hand, kFinger, 1501);
        EXPECT_NE(hand.isHolding, hand.isHoldSuppressed);
        step(hand, kIdle, 1510);
        EXPECT_FALSE(hand.isTapCandidate);
        EXPECT_FALSE(hand.isTap);
        EXPECT_TRUE(hand.wasPastHoldTimeout);
        EXPECT_FALSE(hand.isPastHoldTimeout);
    }
}

TEST(HandStats, OnlyTheReleaseFrameIsATapCandidate) {
    HandStats hand = trustedHand();
    step(hand, kFinger, 1000);
    EXPECT_FALSE(hand.isTapCandidate);
    step(hand, kFinger, 1050);
    EXPECT_FALSE(hand.isTapCandidate);
    step(hand, kIdle, 1100);
    EXPECT_TRUE(hand.isTapCandidate);
    EXPECT_TRUE(hand.isTap);
    step(hand, kIdle, 1110);
    EXPECT_FALSE(hand.isTapCandidate);
    EXPECT_FALSE(hand.isTap);
}

TEST(HandStats, ARejectedCandidateIsNoTapAndTheMarkLastsOneFrame) {
    HandStats hand = trustedHand();
    step(hand, kWeakFinger, 1000);
    step(hand, kIdle, 1400); // 201 / 400 = 0.5025, less than 0.51
    EXPECT_TRUE(hand.isTapCandidate);
    EXPECT_TRUE(hand.isTapRejected);
    EXPECT_FALSE(hand.isTap);
    step(hand, kIdle, 1410);
    EXPECT_FALSE(hand.isTapRejected);
}

TEST(HandStats, WithTapSuppressionTheMarkIsClearedWhereverNoCandidateIs) {
    HandStats hand = trustedHand();
    step(hand, kWeakFinger, 1000); // the rule speaks against every touch that has no end yet
    EXPECT_LT(hand.touchStrengthDurationRatio, 0.0f);
    EXPECT_FALSE(hand.isTapRejected);
    step(hand, kWeakFinger, 1501);
    step(hand, kIdle, 1600); // the end of a hold
    EXPECT_LT(hand.touchStrengthDurationRatio, 0.0f);
    EXPECT_FALSE(hand.isTapCandidate);
    EXPECT_FALSE(hand.isTapRejected);
}

TEST(HandStats, WithoutTapSuppressionEveryCandidateIsATapAndTheMarkStays) {
    HandStats hand = trustedHand();
    hand.enableTapSuppression = false;
    step(hand, kWeakFinger, 1000);
    EXPECT_TRUE(hand.isTapRejected);
    step(hand, kIdle, 1400);
    EXPECT_TRUE(hand.isTapCandidate);
    EXPECT_TRUE(hand.isTapRejected);
    EXPECT_TRUE(hand.isTap);
    step(hand, kIdle, 1410);
    EXPECT_FALSE(hand.isTap);
    EXPECT_TRUE(hand.isTapRejected); // as the rule computed it again
}

TEST(HandStats, WithoutHoldSuppressionTheEndOfALongHoldIsATapToo) {
    HandStats hand = trustedHand();
    hand.enableHoldSuppression = false;
    const Channels firmFinger = Channels().press('A', 600);
    step(hand, firmFinger, 1000);
    step(hand, firmFinger, 1501);
    ASSERT_TRUE(hand.isHolding);
    step(hand, kIdle, 1700); // 600 / 700 = 0.857: firm enough
    EXPECT_TRUE(hand.wasHolding);
    EXPECT_FALSE(hand.isHolding);
    EXPECT_TRUE(hand.isTapCandidate);
    EXPECT_TRUE(hand.isTap);
    EXPECT_EQ(hand.lastEventTime, 1700u);
}

TEST(HandStats, TapIsTheLastEvent) {
    HandStats hand = trustedHand();
    step(hand, Channels().press('G', 300), 1000);
    EXPECT_EQ(hand.lastEventTime, 0u);
    EXPECT_EQ(hand.lastEventRegion, kPixelRegionNone);
    step(hand, kIdle, 1100);
    ASSERT_TRUE(hand.isTap);
    EXPECT_EQ(hand.lastEventTime, 1100u);
    EXPECT_EQ(hand.lastEventRegion, kPixelRegionVolumeUp);
    step(hand, kIdle, 1110);
    EXPECT_EQ(hand.lastEventTime, 1100u);
}

TEST(HandStats, EndOfAHoldIsTheLastEvent) {
    HandStats hand = trustedHand();
    step(hand, Channels().press('N', 300), 1000);
    step(hand, Channels().press('N', 300), 1501);
    step(hand, Channels().press('N', 300), 1600);
    EXPECT_EQ(hand.lastEventTime, 0u); // neither its begin nor its course
    step(hand, kIdle, 1700);
    EXPECT_EQ(hand.lastEventTime, 1700u);
    EXPECT_EQ(hand.lastEventRegion, kPixelRegionVolumeDown);
    step(hand, kIdle, 1710);
    EXPECT_EQ(hand.lastEventTime, 1700u);
}

TEST(HandStats, AHoldMayEndUnderTheFinger) {
    HandStats hand = trustedHand();
    step(hand, kFinger, 1000);
    step(hand, kFinger, 1501);
    ASSERT_TRUE(hand.isHolding);
    hand.holdTimeoutMs = 5000;
    step(hand, kFinger, 1510);
    EXPECT_TRUE(hand.isTouching);
    EXPECT_FALSE(hand.isHolding);
    EXPECT_EQ(hand.lastEventTime, 1510u);
    EXPECT_EQ(hand.lastEventRegion, kPixelRegionPlayPause);
}

TEST(HandStats, RejectedTapsAndSuppressedHoldsAreNoEvents) {
    HandStats hand = distrustedHand();
    step(hand, kWeakFinger, 1000);
    step(hand, kIdle, 1400);
    ASSERT_TRUE(hand.isTapCandidate && !hand.isTap);
    step(hand, kFinger, 2000);
    step(hand, kFinger, 2501);
    ASSERT_TRUE(hand.isHoldSuppressed);
    step(hand, kIdle, 2600);
    EXPECT_EQ(hand.lastEventTime, 0u);
    EXPECT_EQ(hand.lastEventRegion, kPixelRegionNone);
}

} // namespace
} // namespace ZorvaTouch

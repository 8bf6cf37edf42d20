#include "Shared/HandStats.h"

#include "Tests/Support/HandFrames.h"

#include <cmath>
#include <limits>
#include <vector>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

using Testing::Channels;
using Testing::giveEveryFrameTheScore;
using Testing::step;

const Channels kIdle;
const Channels kFinger = Channels().press('A', 300);

/// The score after a decay over this gap.
float decayed(float score, std::uint32_t gapMs, float decayParameter = 7.389056f) {
    HandStats hand;
    hand.touchScore = score;
    hand.decayParameter = decayParameter;
    hand.floorEndTime = 5000;
    hand.decayTouchScore(5000 + gapMs);
    return hand.touchScore;
}

// 1 - exp(gap - 1) / (7.389056 - 1): 0.84348 after 1 ms, 0.57454 after 2 ms, and negative from 3 ms on.
TEST(TouchScoreDecay, IsSteep) {
    EXPECT_EQ(decayed(100.0f, 1), 84.3482361f);
    EXPECT_EQ(decayed(100.0f, 2), 57.4540939f);
    EXPECT_EQ(decayed(100.0f, 3), 0.0f);
    EXPECT_EQ(decayed(100.0f, 4), 0.0f);
    EXPECT_EQ(decayed(100.0f, 1000000), 0.0f);
    EXPECT_EQ(decayed(1.0f, 1), 0.843482375f);
    EXPECT_EQ(decayed(1.0f, 2), 0.574540973f);
}

TEST(TouchScoreDecay, IsComputedInDoublePrecision) {
    EXPECT_EQ(decayed(3.0f, 2), 1.7236228f);   // in single precision 1.72362292
    EXPECT_EQ(decayed(99.9f, 1), 84.2638855f); // with the factor rounded first 84.2638931
}

TEST(TouchScoreDecay, AGapOfNoTimeWrapsAndLeavesNothing) {
    EXPECT_EQ(decayed(100.0f, 0), 0.0f); // 0 - 1 is 2^32 - 1 ms: meant
    EXPECT_EQ(decayed(-100.0f, 0), 0.0f);
}

TEST(TouchScoreDecay, KeepsTheSign) {
    EXPECT_EQ(decayed(-100.0f, 1), -84.3482361f);
    EXPECT_EQ(decayed(-40.0f, 2), -22.981638f);
    EXPECT_TRUE(std::signbit(decayed(-100.0f, 3))); // of the zero as well
    EXPECT_FALSE(std::signbit(decayed(100.0f, 3)));
}

TEST(TouchScoreDecay, NothingDecaysToNothing) {
    EXPECT_EQ(decayed(0.0f, 0), 0.0f); // 0 times minus infinity
    EXPECT_EQ(decayed(0.0f, 1), 0.0f);
    EXPECT_EQ(decayed(-0.0f, 1), 0.0f);
}

TEST(TouchScoreDecay, MeasuresTheGapInWrappingArithmetic) {
    HandStats hand;
    hand.touchScore = 100.0f;
    hand.floorEndTime = 4294967295u;
    hand.decayTouchScore(0);
    EXPECT_EQ(hand.touchScore, 84.3482361f); // 1 ms
    hand.touchScore = 100.0f;
    hand.decayTouchScore(1);
    EXPECT_EQ(hand.touchScore, 57.4540939f); // 2 ms
}

TEST(TouchScoreDecay, FollowsItsParameter) {
    EXPECT_EQ(decayed(100.0f, 1, 101.0f), 99.0f);       // 1 - 1 / 100
    EXPECT_EQ(decayed(100.0f, 2, 101.0f), 97.2817154f); // 1 - e / 100
    EXPECT_EQ(decayed(100.0f, 3, 101.0f), 92.6109467f); // 1 - e^2 / 100
    EXPECT_EQ(decayed(100.0f, 1, 1.0f), 0.0f);          // 1 - infinity
}

TEST(TouchScoreDecay, ParameterCanBeSetBack) {
    HandStats hand;
    hand.decayParameter = 2.0f;
    hand.SetDecayParameters();
    EXPECT_EQ(hand.decayParameter, 7.389056f);
}

TEST(TouchScore, AddsUpTheClassifiersScores) {
    HandStats hand;
    giveEveryFrameTheScore(hand, 2.5f);
    step(hand, kFinger, 1000);
    EXPECT_EQ(hand.touchScore, 2.5f);
    step(hand, kFinger, 1010);
    EXPECT_EQ(hand.touchScore, 5.0f);
    giveEveryFrameTheScore(hand, -7.0f);
    step(hand, kFinger, 1020);
    EXPECT_EQ(hand.touchScore, -2.0f);
    step(hand, kIdle, 1030); // the classifier does not run
    EXPECT_EQ(hand.touchScore, -2.0f);
}

TEST(TouchScore, UsesTheBuiltInClassifierAndTheActivationThreshold) {
    HandStats hand;
    Channels channels;
    channels.electrode('A').value = 201;
    hand.updateTouchScore(channels.pixels, channels.virtualPixels, 1000);
    EXPECT_EQ(hand.svm.score, -2.06483674f); // one channel at 201, as in the classifier's own test
    EXPECT_EQ(hand.touchScore, -2.06483674f);

    HandStats strict;
    strict.activationThreshold = 201.0f;
    strict.updateTouchScore(channels.pixels, channels.virtualPixels, 1000);
    EXPECT_EQ(strict.touchScore, 0.0f);
}

TEST(TouchScore, StaysWithinItsLimit) {
    HandStats hand;
    giveEveryFrameTheScore(hand, 60.0f);
    step(hand, kFinger, 1000);
    EXPECT_EQ(hand.touchScore, 60.0f);
    step(hand, kFinger, 1010);
    EXPECT_EQ(hand.touchScore, 100.0f);
    step(hand, kFinger, 1020);
    EXPECT_EQ(hand.touchScore, 100.0f);
    giveEveryFrameTheScore(hand, -160.0f);
    step(hand, kFinger, 1030);
    EXPECT_EQ(hand.touchScore, -60.0f);
    step(hand, kFinger, 1040);
    EXPECT_EQ(hand.touchScore, -100.0f);
    step(hand, kFinger, 1050);
    EXPECT_EQ(hand.touchScore, -100.0f);
}

TEST(TouchScore, LimitIsATunable) {
    HandStats hand;
    hand.touchScoreLimit = 7.0f;
    giveEveryFrameTheScore(hand, 7.0f);
    step(hand, kFinger, 1000);
    EXPECT_EQ(hand.touchScore, 7.0f);
    step(hand, kFinger, 1010);
    EXPECT_EQ(hand.touchScore, 7.0f);
    giveEveryFrameTheScore(hand, -1000.0f);
    step(hand, kFinger, 1020);
    EXPECT_EQ(hand.touchScore, -7.0f);
}

TEST(TouchScore, IsClippedAfterTheAddition) {
    HandStats hand;
    hand.touchScore = 150.0f; // 150 - 60 = 90 is within the limit
    giveEveryFrameTheScore(hand, -60.0f);
    hand.updateTouchScore(kFinger.pixels, kFinger.virtualPixels, 1000);
    EXPECT_EQ(hand.touchScore, 90.0f);
}

TEST(TouchScore, ANanPassesTheLimit) {
    HandStats hand;
    giveEveryFrameTheScore(hand, std::numeric_limits<float>::quiet_NaN());
    step(hand, kFinger, 1000);
    EXPECT_TRUE(std::isnan(hand.touchScore));
}

struct GapRow {
    std::uint32_t gapMs;
    float score;
};

// Each frame scores +10. An episode that ended with 10 begins again after the gap: decayed first, then added
// to.
TEST(TouchScore, DecaysWhereAnEpisodeAboveTheFloorBegins) {
    const std::vector<GapRow> rows{{0, 10.0f}, {1, 18.434824f}, {2, 15.745409f}, {3, 10.0f}, {50, 10.0f}};
    for (const GapRow &row : rows) {
        SCOPED_TRACE(row.gapMs);
        HandStats hand;
        giveEveryFrameTheScore(hand, 10.0f);
        step(hand, kFinger, 4294967295u);
        EXPECT_EQ(hand.touchScore, 10.0f);
        step(hand, kIdle, 4294967295u); // the floor ends in the last millisecond before the clock wraps
        EXPECT_EQ(hand.touchScore, 10.0f);
        step(hand, kFinger, row.gapMs - 1);
        EXPECT_EQ(hand.touchScore, row.score);
    }
}

TEST(TouchScore, DecaysWithTheFloorAndNotWithTheTouch) {
    HandStats hand;
    giveEveryFrameTheScore(hand, 10.0f);
    const Channels brushed = Channels().brush('A', 250);
    step(hand, kFinger, 1000);
    step(hand, brushed, 1010); // released, but above the floor
    step(hand, kFinger, 1500);
    EXPECT_EQ(hand.touchScore, 30.0f);
    step(hand, kIdle, 1510);
    step(hand, brushed, 1520); // above the floor again, though not touched
    EXPECT_EQ(hand.touchScore, 10.0f);
}

TEST(TouchScore, DoesNotDecayWhileTheFloorLastsOrIsAbsent) {
    HandStats hand;
    hand.touchScore = 10.0f;
    hand.isAboveFloor = hand.wasAboveFloor = true;
    hand.updateTouchScore(kIdle.pixels, kIdle.virtualPixels, 1000);
    EXPECT_EQ(hand.touchScore, 10.0f);
    hand.isAboveFloor = hand.wasAboveFloor = false;
    hand.updateTouchScore(kIdle.pixels, kIdle.virtualPixels, 1010);
    EXPECT_EQ(hand.touchScore, 10.0f);
    hand.wasAboveFloor = true;
    hand.updateTouchScore(kIdle.pixels, kIdle.virtualPixels, 1020);
    EXPECT_EQ(hand.touchScore, 10.0f);
    hand.isAboveFloor = true;
    hand.wasAboveFloor = false;
    hand.updateTouchScore(kIdle.pixels, kIdle.virtualPixels, 1030);
    EXPECT_EQ(hand.touchScore, 0.0f);
}

} // namespace
} // namespace ZorvaTouch

#include "Shared/HandStats.h"

#include "Tests/Support/HandFrames.h"

#include <vector>

#include <gtest/gtest.h>

// The features and scores were worked out apart from this code, each operation rounded to single precision
// and the score summed from left to right.

namespace ZorvaTouch {
namespace {

using Testing::Channels;

/// A touch that has just ended.
struct Touch {
    float maxTouchedValue;
    float activationThreshold = 200.0f;
    std::uint32_t floorStart, touchStart, touchEnd, lastEvent;
    int bystanders = 0; ///< channels that were above the floor and never touched
};

HandStats judged(const Touch &touch) {
    HandStats hand;
    hand.maxTouchedValue = touch.maxTouchedValue;
    hand.activationThreshold = touch.activationThreshold;
    hand.floorStartTime = touch.floorStart;
    hand.touchStartTime = touch.touchStart;
    hand.touchEndTime = touch.touchEnd;
    hand.lastEventTime = touch.lastEvent;
    Channels channels;
    for (std::size_t i = 0; i < static_cast<std::size_t>(touch.bystanders); ++i)
        (i < 15 ? channels.pixels[i] : channels.virtualPixels.at(i - 15)).wasAboveFloor = true;
    hand.updateTapRejection(channels.pixels, channels.virtualPixels);
    return hand;
}

// 100 ms of touch in 110 ms above the floor, at 300 counts.
constexpr Touch kOrdinaryTap{
    .maxTouchedValue = 1.5f, .floorStart = 1000, .touchStart = 1010, .touchEnd = 1110, .lastEvent = 0};

TEST(TapRejection, ComputesItsFeatures) {
    const HandStats hand = judged(kOrdinaryTap);
    EXPECT_EQ(hand.tapStrength, 300.0f);
    EXPECT_EQ(hand.strengthDurationRatio, 2.21727276f);     // 300 / 110 - 0.51
    EXPECT_EQ(hand.touchStrengthDurationRatio, 2.3499999f); // 300 / 100 - 0.65
    EXPECT_EQ(hand.timeDurationRatio, 0.659090936f);        // 100 / 110 - 0.25
    EXPECT_EQ(hand.nonActivePixels, 21);
    EXPECT_EQ(hand.tapSvmScore, 3.95668507f);
    EXPECT_FALSE(hand.isTapRejected);
}

TEST(TapRejection, BystandersLowerTheScore) {
    Touch touch = kOrdinaryTap;
    touch.bystanders = 5;
    const HandStats hand = judged(touch);
    EXPECT_EQ(hand.nonActivePixels, 16);
    EXPECT_EQ(hand.tapSvmScore, 3.01368475f);
}

TEST(TapRejection, StrengthIsInCountsOfTheActivationThreshold) {
    Touch touch = kOrdinaryTap;
    touch.activationThreshold = 100.0f;
    EXPECT_EQ(judged(touch).tapStrength, 150.0f);
    EXPECT_EQ(judged(touch).touchStrengthDurationRatio, 0.850000024f); // 150 / 100 - 0.65
}

TEST(TapRejection, SpanIsTheShorterOfFloorAndLastEvent) {
    Touch touch = kOrdinaryTap;
    touch.lastEvent = 1050; // 60 ms before the end
    const HandStats hand = judged(touch);
    EXPECT_EQ(hand.strengthDurationRatio, 4.48999977f); // 300 / 60 - 0.51
    EXPECT_EQ(hand.timeDurationRatio, 1.41666663f);     // 100 / 60 - 0.25
    EXPECT_EQ(hand.touchStrengthDurationRatio, 2.3499999f);
    EXPECT_EQ(hand.tapSvmScore, 6.64766884f);
}

TEST(TapRejection, TimesWrap) {
    // As the ordinary tap, 1060 ms earlier: its floor and its touch begin before the clock wraps.
    const HandStats hand = judged({.maxTouchedValue = 1.5f,
                                   .floorStart = 4294967236u,
                                   .touchStart = 4294967246u,
                                   .touchEnd = 50,
                                   .lastEvent = 4294966236u});
    EXPECT_EQ(hand.strengthDurationRatio, 2.21727276f);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 2.3499999f);
    EXPECT_EQ(hand.timeDurationRatio, 0.659090936f);
    EXPECT_EQ(hand.tapSvmScore, 3.95668507f);
}

TEST(TapRejection, AnEventAfterTheEndIsLongAgo) {
    Touch touch = kOrdinaryTap;
    touch.lastEvent = 1111; // 2^32 - 1 ms before the end: the floor is the shorter
    EXPECT_EQ(judged(touch).strengthDurationRatio, 2.21727276f);
}

TEST(TapRejection, WithoutASpanItsRatiosAreZero) {
    Touch touch = kOrdinaryTap;
    touch.lastEvent = 1110; // in the millisecond of the end
    const HandStats hand = judged(touch);
    EXPECT_EQ(hand.strengthDurationRatio, 0.0f);
    EXPECT_EQ(hand.timeDurationRatio, 0.0f);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 2.3499999f);
    EXPECT_EQ(hand.tapSvmScore, 1.54900002f); // 0.1886 * 21 - 2.4116
    EXPECT_FALSE(hand.isTapRejected);         // by itself it rejects nothing

    touch.lastEvent = 0;
    touch.floorStart = 1110;
    EXPECT_EQ(judged(touch).strengthDurationRatio, 0.0f);
    EXPECT_EQ(judged(touch).timeDurationRatio, 0.0f);
}

TEST(TapRejection, ATouchOfNoLengthIsRejected) {
    Touch touch = kOrdinaryTap;
    touch.touchStart = 1110;
    const HandStats hand = judged(touch);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 0.0f);
    EXPECT_EQ(hand.strengthDurationRatio, 2.21727276f);
    EXPECT_EQ(hand.timeDurationRatio, -0.25f); // 0 / 110 - 0.25
    EXPECT_TRUE(hand.isTapRejected);
}

TEST(TapRejection, ATouchOfNoLengthIsRejectedByItselfToo) {
    Touch touch = kOrdinaryTap;
    touch.touchStart = touch.lastEvent = 1110; // neither length nor span
    const HandStats hand = judged(touch);
    EXPECT_EQ(hand.strengthDurationRatio, 0.0f);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 0.0f);
    EXPECT_EQ(hand.timeDurationRatio, 0.0f);
    EXPECT_EQ(hand.tapSvmScore, 1.54900002f);
    EXPECT_TRUE(hand.isTapRejected);
}

TEST(TapRejection, RatiosOfTheFrameBeforeAreForgotten) {
    HandStats hand;
    hand.strengthDurationRatio = hand.touchStrengthDurationRatio = hand.timeDurationRatio = 9.0f;
    hand.updateTapRejection(Channels().pixels, Channels().virtualPixels);
    EXPECT_EQ(hand.strengthDurationRatio, 0.0f);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 0.0f);
    EXPECT_EQ(hand.timeDurationRatio, 0.0f);
}

TEST(TapRejection, TheMarkIsSetAnewEveryTime) {
    HandStats hand = judged(kOrdinaryTap);
    hand.isTapRejected = true;
    hand.updateTapRejection(Channels().pixels, Channels().virtualPixels);
    EXPECT_FALSE(hand.isTapRejected);
}

TEST(TapRejection, BystandersWereAboveTheFloorAndNeverTouched) {
    Channels channels;
    channels.electrode('A').wasAboveFloor = true;
    channels.electrode('B').wasAboveFloor = channels.electrode('B').wasTouched = true;
    channels.electrode('C').wasTouched = true;
    channels.electrode('D').isAboveFloor = true; // the sticky flags count
    channels.electrode('O').wasAboveFloor = channels.electrode('O').isTouched = true;
    channels.group("ABE").wasAboveFloor = true;
    channels.group("MNO").wasAboveFloor = true;
    channels.group("KLM").wasAboveFloor = channels.group("KLM").wasTouched = true;
    HandStats hand;
    hand.updateTapRejection(channels.pixels, channels.virtualPixels);
    EXPECT_EQ(hand.nonActivePixels, 17); // 21 less A, O, ABE and MNO
}

TEST(TapRejection, AllChannelsMayBeBystanders) {
    Touch touch = kOrdinaryTap;
    touch.bystanders = 38;
    EXPECT_EQ(judged(touch).nonActivePixels, -17);
}

// What follows isolates each reason for a rejection: the other features speak for the tap.

TEST(TapRejection, ByANegativeScore) {
    // 151 counts, 50 ms of 100: 0.1886 * n + 0.2772 * 1 + 2.7205 * 0.25 - 2.4116.
    Touch touch{
        .maxTouchedValue = 0.755f, .floorStart = 1000, .touchStart = 1050, .touchEnd = 1100, .lastEvent = 0};
    touch.bystanders = 13;
    EXPECT_EQ(judged(touch).strengthDurationRatio, 1.0f);
    EXPECT_EQ(judged(touch).tapSvmScore, 0.0545248985f);
    EXPECT_FALSE(judged(touch).isTapRejected);
    touch.bystanders = 14;
    EXPECT_EQ(judged(touch).tapSvmScore, -0.134075165f);
    EXPECT_TRUE(judged(touch).isTapRejected);
}

TEST(TapRejection, NotByAScoreOfZero) {
    // This strength, 131.330063 counts, makes the rounded sum exactly 0.
    const HandStats hand = judged({.maxTouchedValue = 0x1.503478p-1f,
                                   .floorStart = 1000,
                                   .touchStart = 1050,
                                   .touchEnd = 1100,
                                   .lastEvent = 0,
                                   .bystanders = 13});
    EXPECT_EQ(hand.strengthDurationRatio, 0.803300619f);
    EXPECT_EQ(hand.tapSvmScore, 0.0f);
    EXPECT_FALSE(hand.isTapRejected);
}

TEST(TapRejection, ByTooShortATouchForItsSpan) {
    Touch touch{
        .maxTouchedValue = 1.5f, .floorStart = 1000, .touchStart = 1300, .touchEnd = 1400, .lastEvent = 0};
    EXPECT_EQ(judged(touch).timeDurationRatio, 0.0f); // 100 / 400 = 0.25 exactly
    EXPECT_EQ(judged(touch).tapSvmScore, 1.61552811f);
    EXPECT_FALSE(judged(touch).isTapRejected);
    touch.floorStart = 999;
    EXPECT_EQ(judged(touch).timeDurationRatio, -0.000623434782f);
    EXPECT_EQ(judged(touch).tapSvmScore, 1.61331367f);
    EXPECT_TRUE(judged(touch).isTapRejected);
}

TEST(TapRejection, ByMoreThanTwentyOneBystanders) {
    Touch touch{
        .maxTouchedValue = 50.0f, .floorStart = 1000, .touchStart = 1000, .touchEnd = 1100, .lastEvent = 0};
    touch.bystanders = 21;
    EXPECT_EQ(judged(touch).nonActivePixels, 0);
    EXPECT_EQ(judged(touch).tapSvmScore, 27.2074032f);
    EXPECT_FALSE(judged(touch).isTapRejected);
    touch.bystanders = 22;
    EXPECT_EQ(judged(touch).nonActivePixels, -1);
    EXPECT_EQ(judged(touch).tapSvmScore, 27.0188026f);
    EXPECT_TRUE(judged(touch).isTapRejected);
}

TEST(TapRejection, ByTooLittleStrengthForItsSpan) {
    Touch touch{.maxTouchedValue = 0.5f,
                .activationThreshold = 102.0f,
                .floorStart = 1000,
                .touchStart = 1050,
                .touchEnd = 1100,
                .lastEvent = 0};
    EXPECT_EQ(judged(touch).strengthDurationRatio, 0.0f); // 51 / 100 = 0.51 exactly
    EXPECT_EQ(judged(touch).tapSvmScore, 2.22912502f);
    EXPECT_FALSE(judged(touch).isTapRejected);
    touch.activationThreshold = 100.0f;
    EXPECT_EQ(judged(touch).strengthDurationRatio, -0.00999999046f);
    EXPECT_EQ(judged(touch).tapSvmScore, 2.22635269f);
    EXPECT_TRUE(judged(touch).isTapRejected);
}

TEST(TapRejection, ByTooLittleStrengthForItsLengthAndAtTheLimit) {
    Touch touch{.maxTouchedValue = 0.5f,
                .activationThreshold = 130.0f,
                .floorStart = 1000,
                .touchStart = 1000,
                .touchEnd = 1100,
                .lastEvent = 0};
    EXPECT_EQ(judged(touch).touchStrengthDurationRatio,
              0.0f); // 65 / 100 = 0.65 exactly: rejected, unlike the others
    EXPECT_EQ(judged(touch).tapSvmScore, 3.62818336f);
    EXPECT_TRUE(judged(touch).isTapRejected);
    touch.activationThreshold = 132.0f;
    EXPECT_EQ(judged(touch).touchStrengthDurationRatio, 0.0100000501f);
    EXPECT_FALSE(judged(touch).isTapRejected);
}

} // namespace
} // namespace ZorvaTouch

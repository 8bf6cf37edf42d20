#include "Shared/HandStats.h"

#include "Tests/Support/HandFrames.h"

#include <limits>
#include <vector>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

using Testing::Channels;
using RegionMax = std::array<float, 4>; // none, play/pause, volume down, volume up

constexpr std::int32_t kA = 0, kB = 1, kG = 6, kI = 8, kK = 10, kL = 11, kM = 12;

TEST(Fuzzify, InterpolatesWithoutClipping) {
    EXPECT_EQ(HandStats::fuzzify(1.5f, 1, 2, 10, 20), 15.0f);
    EXPECT_EQ(HandStats::fuzzify(1.0f, 1, 2, 10, 20), 10.0f);
    EXPECT_EQ(HandStats::fuzzify(2.0f, 1, 2, 10, 20), 20.0f);
    EXPECT_EQ(HandStats::fuzzify(3.0f, 1, 2, 10, 20), 30.0f); // 20 * 2 + 10 * -1
    EXPECT_EQ(HandStats::fuzzify(0.0f, 1, 2, 10, 20), 0.0f);  // 20 * -1 + 10 * 2
    EXPECT_EQ(HandStats::fuzzify(1.25f, 1, 2, 20, 10), 17.5f);
}

TEST(Fuzzify, ClipsAtBothEnds) {
    EXPECT_EQ(HandStats::fuzzifyAndClip(1.5f, 1, 2, 10, 20), 15.0f);
    EXPECT_EQ(HandStats::fuzzifyAndClip(0.5f, 1, 2, 10, 20), 10.0f);
    EXPECT_EQ(HandStats::fuzzifyAndClip(2.5f, 1, 2, 10, 20), 20.0f);
    EXPECT_EQ(HandStats::fuzzifyAndClip(1.0f, 1, 1, 10, 20), 10.0f); // the lower end is asked first
    EXPECT_EQ(HandStats::fuzzifyAndClip(std::numeric_limits<float>::infinity(), 1, 2, 10, 20), 20.0f);
}

// y1 * u + y0 * (1 - u), each operation rounded to single precision; y0 + u * (y1 - y0) gives 3.14999962 and
// 4.38333321.
TEST(Fuzzify, RoundsAsWritten) {
    EXPECT_EQ(HandStats::fuzzify(0.35f, 0.2f, 0.5f, 1.3f, 5.0f), 3.14999986f);
    EXPECT_EQ(HandStats::fuzzify(0.45f, 0.2f, 0.5f, 1.3f, 5.0f), 4.38333273f);
}

float biasAfter(std::uint32_t sinceLastEventMs, std::uint32_t lastEventTime = 5000) {
    HandStats hand;
    hand.lastEventTime = lastEventTime;
    return hand.updateTimeBiasFactor(lastEventTime + sinceLastEventMs);
}

TEST(TimeBias, RunsFrom065To1Between300MsAndOneSecond) {
    EXPECT_EQ(biasAfter(0), 0.65f);
    EXPECT_EQ(biasAfter(300), 0.65f);
    EXPECT_EQ(biasAfter(500), 0.75f); // u = 0.2 / 0.7 = 2 / 7; 2 / 7 + 5 / 7 * 0.65 = 0.75
    EXPECT_EQ(biasAfter(1000), 1.0f);
    EXPECT_EQ(biasAfter(1001), 1.0f);
    EXPECT_EQ(biasAfter(4294967295u), 1.0f);
}

// Worked out with every operation but the first in single precision. With 0.001 as a float the bias after 301
// ms would be 0.6505; the 999 ms show that the upper end is not reached early.
TEST(TimeBias, TakesMillisecondsToSecondsInDoublePrecision) {
    EXPECT_EQ(biasAfter(301), 0.65049994f);
    EXPECT_EQ(biasAfter(650), 0.824999928f);
    EXPECT_EQ(biasAfter(999), 0.999500036f);
}

TEST(TimeBias, MeasuresInWrappingArithmetic) {
    EXPECT_EQ(biasAfter(500, 4294967040u), 0.75f); // the clock wraps after 256 ms
    EXPECT_EQ(biasAfter(300, 4294967295u), 0.65f);
}

TEST(RegionMax, IsTheLargestValueAboveTheFloorOfEachRegion) {
    Channels channels;
    channels.electrode('A').value = 100;
    channels.electrode('K').value = 130;
    channels.electrode('F').value = 120;
    channels.electrode('G').value = 175;
    channels.electrode('J').value = 174;
    channels.electrode('L').value = 75;
    channels.electrode('O').value = 76;
    HandStats hand;
    hand.updateRegionMax(channels.pixels);
    EXPECT_EQ(hand.regionMax, (RegionMax{0, 55, 1, 100}));
}

TEST(RegionMax, IsOfThisFrameOnly) {
    HandStats hand;
    hand.regionMax = {9, 9, 9, 9};
    hand.updateRegionMax(Channels().pixels);
    EXPECT_EQ(hand.regionMax, (RegionMax{0, 0, 0, 0}));
}

TEST(RegionMax, ValuesAtTheFloorAndBelowZeroCountNothing) {
    Channels channels;
    channels.electrode('A').value = 75;
    channels.electrode('G').value = -1000;
    HandStats hand;
    hand.updateRegionMax(channels.pixels);
    EXPECT_EQ(hand.regionMax, (RegionMax{0, 0, 0, 0}));
}

TEST(RegionMax, ElectrodesWithoutARegionCountNothing) {
    Channels channels;
    channels.electrode('A').value = 500;
    channels.electrode('A').index = 20;
    HandStats hand;
    hand.updateRegionMax(channels.pixels);
    EXPECT_EQ(hand.regionMax, (RegionMax{0, 0, 0, 0}));
}

/// A touch for `updateActiveRegion`: where the strongest channel of the touch was, and what came before.
struct Touch {
    std::int32_t maxTouchedIndex = kA;
    PixelRegion lastEventRegion = kPixelRegionNone;
    std::uint32_t sinceLastEventMs = 0; ///< 0 to 300: bias 0.65
    float activationThreshold = 200.0f;
};

PixelRegion regionOf(const Touch &touch, const Channels &channels) {
    HandStats hand;
    hand.maxTouchedIndex = touch.maxTouchedIndex;
    hand.lastEventRegion = touch.lastEventRegion;
    hand.lastEventTime = 1000;
    hand.activationThreshold = touch.activationThreshold;
    return hand.updateActiveRegion(channels.pixels, channels.virtualPixels, 1000 + touch.sinceLastEventMs);
}

TEST(ActiveRegion, IsThatOfTheStrongestTouchedElectrode) {
    EXPECT_EQ(regionOf({.maxTouchedIndex = kA}, Channels()), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf({.maxTouchedIndex = kG}, Channels()), kPixelRegionVolumeUp);
    EXPECT_EQ(regionOf({.maxTouchedIndex = kL}, Channels()), kPixelRegionVolumeDown);
    EXPECT_EQ(regionOf({.maxTouchedIndex = kK}, Channels()), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf({.maxTouchedIndex = 20}, Channels()), kPixelRegionNone);
}

TEST(ActiveRegion, UpdatesTheRegionMaxima) {
    Channels channels;
    channels.electrode('B').value = 175;
    HandStats hand;
    hand.regionMax = {0, 7, 7, 7};
    hand.activeRegion = kPixelRegionVolumeDown;
    EXPECT_EQ(hand.updateActiveRegion(channels.pixels, channels.virtualPixels, 0), kPixelRegionPlayPause);
    EXPECT_EQ(hand.regionMax, (RegionMax{0, 100, 0, 0}));
    EXPECT_EQ(hand.activeRegion, kPixelRegionVolumeDown); // the caller stores what is returned
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionNone);
}

// A touch on A at 1.0 with I second, shortly after an event in I's region: all that stickiness asks for.
const Touch kAfterVolumeUp{.maxTouchedIndex = kA, .lastEventRegion = kPixelRegionVolumeUp};

TEST(Stickiness, PullsToTheRegionOfTheLastEvent) {
    EXPECT_EQ(regionOf(kAfterVolumeUp, Channels().remember('A', 1.0f).remember('I', 0.8f)),
              kPixelRegionVolumeUp);
}

TEST(Stickiness, TheSecondMustExceedItsShareOfTheTop) {
    EXPECT_EQ(regionOf(kAfterVolumeUp, Channels().remember('A', 1.0f).remember('I', 0.65f)),
              kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(kAfterVolumeUp, Channels().remember('A', 1.0f).remember('I', 0.651f)),
              kPixelRegionVolumeUp);
    EXPECT_EQ(regionOf(kAfterVolumeUp, Channels().remember('A', 2.0f).remember('I', 1.3f)),
              kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(kAfterVolumeUp, Channels().remember('A', 2.0f).remember('I', 1.31f)),
              kPixelRegionVolumeUp);
}

TEST(Stickiness, FadesWithTimeAndEndsAfterOneSecond) {
    Touch touch = kAfterVolumeUp;
    touch.sinceLastEventMs = 500; // bias 0.75
    EXPECT_EQ(regionOf(touch, Channels().remember('A', 1.0f).remember('I', 0.75f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(touch, Channels().remember('A', 1.0f).remember('I', 0.76f)), kPixelRegionVolumeUp);
    touch.sinceLastEventMs = 1000; // bias 1: not even an equal second is enough
    EXPECT_EQ(regionOf(touch, Channels().remember('A', 1.0f).remember('I', 1.0f)), kPixelRegionPlayPause);
}

TEST(Stickiness, TheSecondMustBeAboveTheFloor) {
    // 75 / 200 = 0.375; 0.38 is far more than 0.65 of 0.4 anyway.
    EXPECT_EQ(regionOf(kAfterVolumeUp, Channels().remember('A', 0.4f).remember('I', 0.375f)),
              kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(kAfterVolumeUp, Channels().remember('A', 0.4f).remember('I', 0.38f)),
              kPixelRegionVolumeUp);
}

TEST(Stickiness, TheFloorIsInUnitsOfTheActivationThreshold) {
    Touch touch = kAfterVolumeUp;
    touch.activationThreshold = 100.0f; // 0.75
    EXPECT_EQ(regionOf(touch, Channels().remember('A', 0.8f).remember('I', 0.75f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(touch, Channels().remember('A', 0.8f).remember('I', 0.76f)), kPixelRegionVolumeUp);
    touch.activationThreshold = 0.0f; // infinite: nothing is above it
    EXPECT_EQ(regionOf(touch, Channels().remember('A', 9.0f).remember('I', 8.0f)), kPixelRegionPlayPause);
    touch.activationThreshold = std::numeric_limits<float>::quiet_NaN(); // nor above a NaN
    EXPECT_EQ(regionOf(touch, Channels().remember('A', 9.0f).remember('I', 8.0f)), kPixelRegionPlayPause);
    touch.activationThreshold = -200.0f; // everything is above -0.375
    EXPECT_EQ(regionOf(touch, Channels().remember('A', 0.1f).remember('I', 0.09f)), kPixelRegionVolumeUp);
}

TEST(Stickiness, TheTopMustLieInTheRegionOfTheTouch) {
    Touch touch = kAfterVolumeUp;
    touch.maxTouchedIndex = kL; // volume down, but A is the top
    EXPECT_EQ(regionOf(touch, Channels().remember('A', 1.0f).remember('I', 0.9f)), kPixelRegionVolumeDown);
}

TEST(Stickiness, TheSecondMustLieInTheRegionOfTheLastEvent) {
    EXPECT_EQ(regionOf(kAfterVolumeUp, Channels().remember('A', 1.0f).remember('L', 0.9f)),
              kPixelRegionPlayPause);
    EXPECT_EQ(
        regionOf(kAfterVolumeUp, Channels().remember('A', 1.0f).remember('B', 0.9f).remember('I', 0.8f)),
        kPixelRegionPlayPause);
}

TEST(Stickiness, WorksBetweenAnyTwoRegions) {
    EXPECT_EQ(regionOf({.maxTouchedIndex = kI, .lastEventRegion = kPixelRegionPlayPause},
                       Channels().remember('I', 1.0f).remember('B', 0.8f)),
              kPixelRegionPlayPause);
    EXPECT_EQ(regionOf({.maxTouchedIndex = kB, .lastEventRegion = kPixelRegionVolumeDown},
                       Channels().remember('B', 1.0f).remember('L', 0.8f)),
              kPixelRegionVolumeDown);
    EXPECT_EQ(regionOf({.maxTouchedIndex = kA, .lastEventRegion = kPixelRegionNone},
                       Channels().remember('A', 1.0f).remember('I', 0.8f)),
              kPixelRegionPlayPause);
}

TEST(Stickiness, RanksByTheLargestValueSoFarAndNotByThePresentOne) {
    Channels channels = Channels().remember('A', 1.0f).remember('I', 0.8f);
    channels.electrode('L').normalizedValue = 5.0f;
    channels.electrode('L').value = 1000;
    EXPECT_EQ(regionOf(kAfterVolumeUp, channels), kPixelRegionVolumeUp);
}

TEST(Stickiness, EqualElectrodesRankByTheirIndex) {
    // A before G: A is the top and G the second.
    EXPECT_EQ(regionOf(kAfterVolumeUp, Channels().remember('A', 1.0f).remember('G', 1.0f)),
              kPixelRegionVolumeUp);
    // B before I: B is the second, and not of the last event's region.
    EXPECT_EQ(
        regionOf(kAfterVolumeUp, Channels().remember('A', 1.0f).remember('B', 0.8f).remember('I', 0.8f)),
        kPixelRegionPlayPause);
    // G before L, all the same: G is the second.
    EXPECT_EQ(
        regionOf(kAfterVolumeUp,
                 Channels().remember('A', 1.0f).remember('G', 1.0f).remember('L', 1.0f).remember('O', 1.0f)),
        kPixelRegionVolumeUp);
}

TEST(Stickiness, FindsTopAndSecondWhereverTheyAre) {
    // The top after the second, with weaker ones around them.
    EXPECT_EQ(
        regionOf({.maxTouchedIndex = 14, .lastEventRegion = kPixelRegionPlayPause},
                 Channels().remember('A', 0.9f).remember('D', 0.5f).remember('I', 0.6f).remember('O', 1.0f)),
        kPixelRegionPlayPause);
    EXPECT_EQ(regionOf({.maxTouchedIndex = 14, .lastEventRegion = kPixelRegionVolumeUp},
                       Channels().remember('A', 0.7f).remember('J', 0.9f).remember('O', 1.0f)),
              kPixelRegionVolumeUp);
}

// K at 1.0 is the strongest of the touch and M or I the second; the group with both decides.
const Touch kOnK{.maxTouchedIndex = kK};
Channels kWith(char neighbour, std::string_view group, float groupMax, float k = 1.0f, float second = 0.5f) {
    return Channels().remember('K', k).remember(neighbour, second).remember(group, groupMax);
}

TEST(ElectrodeK, GoesToVolumeDownWithMWhenTheirGroupIsStrongEnough) {
    EXPECT_EQ(regionOf(kOnK, kWith('M', "KLM", 0.7f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(kOnK, kWith('M', "KLM", 0.71f)), kPixelRegionVolumeDown);
    EXPECT_EQ(regionOf(kOnK, kWith('M', "KLM", 1.4f, 2.0f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(kOnK, kWith('M', "KLM", 1.41f, 2.0f)), kPixelRegionVolumeDown);
}

TEST(ElectrodeK, GoesToVolumeUpWithIWhenTheirGroupIsStrongEnough) {
    EXPECT_EQ(regionOf(kOnK, kWith('I', "IJK", 0.7f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(kOnK, kWith('I', "IJK", 0.71f)), kPixelRegionVolumeUp);
    EXPECT_EQ(regionOf(kOnK, kWith('I', "IJK", 1.4f, 2.0f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(kOnK, kWith('I', "IJK", 1.41f, 2.0f)), kPixelRegionVolumeUp);
}

TEST(ElectrodeK, EachNeighbourHasItsOwnGroup) {
    EXPECT_EQ(regionOf(kOnK, kWith('M', "IJK", 1.0f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(kOnK, kWith('I', "KLM", 1.0f)), kPixelRegionPlayPause);
}

TEST(ElectrodeK, OtherNeighboursPullNowhere) {
    for (const char neighbour : {'A', 'J', 'L', 'N', 'O', 'H'}) {
        EXPECT_EQ(regionOf(kOnK, kWith(neighbour, "KLM", 1.0f).remember("IJK", 1.0f)), kPixelRegionPlayPause)
            << neighbour;
    }
}

TEST(ElectrodeK, ItsNeighbourMustBeAboveTheFloor) {
    EXPECT_EQ(regionOf(kOnK, kWith('M', "KLM", 1.0f, 1.0f, 0.375f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(kOnK, kWith('M', "KLM", 1.0f, 1.0f, 0.376f)), kPixelRegionVolumeDown);
    EXPECT_EQ(regionOf(kOnK, kWith('I', "IJK", 1.0f, 1.0f, 0.375f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(kOnK, kWith('I', "IJK", 1.0f, 1.0f, 0.376f)), kPixelRegionVolumeUp);
}

TEST(ElectrodeK, MustBeTheStrongestOfTheTouchAndTheTop) {
    EXPECT_EQ(regionOf({.maxTouchedIndex = kA}, kWith('M', "KLM", 1.0f)), kPixelRegionPlayPause);
    // K strongest of the touch, but M the top.
    EXPECT_EQ(regionOf(kOnK, kWith('M', "KLM", 2.0f, 1.0f, 1.1f)), kPixelRegionPlayPause);
    // K strongest of the touch and M the second, but A the top.
    EXPECT_EQ(regionOf(kOnK, kWith('M', "KLM", 2.0f, 1.0f, 1.1f).remember('A', 1.2f)), kPixelRegionPlayPause);
}

TEST(ElectrodeK, AfterAnEventOnThatSideLessIsEnough) {
    // Bias 0.65 shortly after; M and I at 0.5 are too weak for stickiness itself.
    const Touch afterDown{.maxTouchedIndex = kK, .lastEventRegion = kPixelRegionVolumeDown};
    EXPECT_EQ(regionOf(afterDown, kWith('M', "KLM", 0.65f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(afterDown, kWith('M', "KLM", 0.66f)), kPixelRegionVolumeDown);
    EXPECT_EQ(regionOf(afterDown, kWith('I', "IJK", 0.69f)), kPixelRegionPlayPause); // the other side: 0.7
    EXPECT_EQ(regionOf(afterDown, kWith('I', "IJK", 0.71f)), kPixelRegionVolumeUp);
    const Touch afterUp{.maxTouchedIndex = kK, .lastEventRegion = kPixelRegionVolumeUp};
    EXPECT_EQ(regionOf(afterUp, kWith('I', "IJK", 0.65f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(afterUp, kWith('I', "IJK", 0.66f)), kPixelRegionVolumeUp);
    EXPECT_EQ(regionOf(afterUp, kWith('M', "KLM", 0.69f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(afterUp, kWith('M', "KLM", 0.71f)), kPixelRegionVolumeDown);
    const Touch afterPlay{.maxTouchedIndex = kK, .lastEventRegion = kPixelRegionPlayPause};
    EXPECT_EQ(regionOf(afterPlay, kWith('M', "KLM", 0.69f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(afterPlay, kWith('I', "IJK", 0.69f)), kPixelRegionPlayPause);
}

TEST(ElectrodeK, LongAfterAnEventTheShareIsNeverMoreThan07) {
    const Touch afterDown{.maxTouchedIndex = kK,
                          .lastEventRegion = kPixelRegionVolumeDown,
                          .sinceLastEventMs = 500}; // bias 0.75
    EXPECT_EQ(regionOf(afterDown, kWith('M', "KLM", 0.7f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(afterDown, kWith('M', "KLM", 0.71f)), kPixelRegionVolumeDown);
    const Touch afterUp{
        .maxTouchedIndex = kK, .lastEventRegion = kPixelRegionVolumeUp, .sinceLastEventMs = 500};
    EXPECT_EQ(regionOf(afterUp, kWith('I', "IJK", 0.7f)), kPixelRegionPlayPause);
    EXPECT_EQ(regionOf(afterUp, kWith('I', "IJK", 0.71f)), kPixelRegionVolumeUp);
}

TEST(ElectrodeK, StickinessHoldsWhenTheGroupDoesNotSpeak) {
    // M at 0.8 exceeds 0.65 of K: back to volume down although the group is weak.
    EXPECT_EQ(regionOf({.maxTouchedIndex = kK, .lastEventRegion = kPixelRegionVolumeDown},
                       kWith('M', "KLM", 0.1f, 1.0f, 0.8f)),
              kPixelRegionVolumeDown);
}

TEST(ElectrodeK, UpdatesTheRegionMaximaAllTheSame) {
    Channels channels = kWith('M', "KLM", 1.0f);
    channels.electrode('M').value = 85;
    HandStats hand;
    hand.maxTouchedIndex = kK;
    EXPECT_EQ(hand.updateActiveRegion(channels.pixels, channels.virtualPixels, 0), kPixelRegionVolumeDown);
    EXPECT_EQ(hand.regionMax, (RegionMax{0, 0, 10, 0}));
}

/// A hold in the play/pause region with these maxima of the last update.
HandStats holdInPlayPause(RegionMax regionMax) {
    HandStats hand;
    hand.activeRegion = kPixelRegionPlayPause;
    hand.regionMax = regionMax;
    hand.regionSwitchFactor = 9.0f;
    return hand;
}

/// A frame in which A and G are this much above the floor.
Channels frameOf(std::int32_t a, std::int32_t g) {
    Channels channels;
    channels.electrode('A').value = 75 + a;
    channels.electrode('G').value = 75 + g;
    return channels;
}

TEST(HoldRegion, TheSameRegionIsDecidedWithoutTheMaxima) {
    HandStats hand = holdInPlayPause({0, 1, 2, 3});
    EXPECT_EQ(hand.changeActiveRegion(frameOf(100, 100).pixels, kB), kPixelRegionPlayPause);
    EXPECT_EQ(hand.regionMax, (RegionMax{0, 1, 2, 3}));
    EXPECT_EQ(hand.regionSwitchFactor, 9.0f);
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionPlayPause);
}

TEST(HoldRegion, NoRegionOnEitherSideIsDecidedWithoutTheMaxima) {
    HandStats hand = holdInPlayPause({0, 1, 2, 3});
    EXPECT_EQ(hand.changeActiveRegion(frameOf(100, 100).pixels, 20), kPixelRegionNone);
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionPlayPause);
    hand.activeRegion = kPixelRegionNone;
    EXPECT_EQ(hand.changeActiveRegion(frameOf(100, 100).pixels, kG), kPixelRegionVolumeUp);
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionNone);
    EXPECT_EQ(hand.regionMax, (RegionMax{0, 1, 2, 3}));
    EXPECT_EQ(hand.regionSwitchFactor, 9.0f);
}

TEST(HoldRegion, TheCallerStoresTheNewRegion) {
    HandStats hand = holdInPlayPause({0, 0, 0, 0});
    EXPECT_EQ(hand.changeActiveRegion(frameOf(100, 100).pixels, kG), kPixelRegionVolumeUp);
    EXPECT_EQ(hand.activeRegion, kPixelRegionPlayPause);
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionPlayPause);
}

struct MoveRow {
    std::int32_t a, g;  ///< above the floor now; both were at 100 and 50 before, a ratio of 0.5
    PixelRegion region; ///< of the hold after the frame
    float switchFactor;
};

TEST(HoldRegion, MovesWhenTheCandidateHasGainedByTheFactor) {
    constexpr PixelRegion stays = kPixelRegionPlayPause, moves = kPixelRegionVolumeUp;
    const std::vector<MoveRow> rows{
        {100, 64, stays, 1.3f},  // no drop: factor 1.3, 0.5 * 1.3 = 0.65
        {100, 65, moves, 1.3f},  // not less is enough
        {200, 129, stays, 1.3f}, // a rise is no drop
        {200, 130, moves, 1.3f},
        {80, 51, stays, 1.3f}, // a drop of exactly 0.2
        {80, 52, moves, 1.3f},
        {65, 102, stays, 3.14999986f}, // drop 0.35, half way: 3.15, and 0.5 * 3.15 * 65 = 102.4
        {65, 103, moves, 3.14999986f},
        {50, 124, stays, 5.0f}, // a drop of exactly 0.5: factor 5, 0.5 * 5 * 50 = 125
        {50, 125, moves, 5.0f},
        {40, 99, stays, 5.0f}, // beyond it no more than 5
        {40, 100, moves, 5.0f},
    };
    for (const MoveRow &row : rows) {
        SCOPED_TRACE(std::to_string(row.a) + ", " + std::to_string(row.g));
        HandStats hand = holdInPlayPause({0, 100, 0, 50});
        EXPECT_EQ(hand.changeActiveRegion(frameOf(row.a, row.g).pixels, kG), row.region);
        EXPECT_EQ(hand.regionSwitchFactor, row.switchFactor);
        EXPECT_EQ(hand.regionMax, (RegionMax{0, static_cast<float>(row.a), 0, static_cast<float>(row.g)}));
        EXPECT_EQ(hand.previousActiveRegion, kPixelRegionPlayPause);
    }
}

TEST(HoldRegion, FromNothingAnythingMovesIt) {
    HandStats hand = holdInPlayPause({0, 0, 0, 50});
    EXPECT_EQ(hand.changeActiveRegion(frameOf(200, 1).pixels, kG), kPixelRegionVolumeUp);
    EXPECT_EQ(hand.regionSwitchFactor, 1.3f); // no drop
}

TEST(HoldRegion, FromNothingEvenNothingMovesIt) {
    HandStats hand = holdInPlayPause({0, 0, 0, 0});
    EXPECT_EQ(hand.changeActiveRegion(frameOf(200, 0).pixels, kG),
              kPixelRegionVolumeUp); // 0 is not less than 0
}

TEST(HoldRegion, AnAbsentCandidateMovesItWhenItWasAbsentBefore) {
    HandStats hand = holdInPlayPause({0, 100, 0, 0});
    EXPECT_EQ(hand.changeActiveRegion(frameOf(100, 0).pixels, kG),
              kPixelRegionVolumeUp); // ratio 0 before and now
    HandStats other = holdInPlayPause({0, 100, 0, 1});
    EXPECT_EQ(other.changeActiveRegion(frameOf(100, 0).pixels, kG), kPixelRegionPlayPause);
}

TEST(HoldRegion, WhenItsOwnRegionHasGoneItMovesAndKeepsTheFactor) {
    HandStats hand = holdInPlayPause({0, 100, 0, 50});
    EXPECT_EQ(hand.changeActiveRegion(frameOf(0, 1).pixels, kG), kPixelRegionVolumeUp);
    EXPECT_EQ(hand.regionSwitchFactor, 9.0f); // decided before the factor is computed
    EXPECT_EQ(hand.regionMax, (RegionMax{0, 0, 0, 1}));
}

TEST(HoldRegion, CandidateIsTheRegionOfTheGivenElectrode) {
    HandStats hand = holdInPlayPause({0, 100, 50, 50});
    Channels channels = frameOf(100, 64);
    channels.electrode('M').value = 75 + 65;
    EXPECT_EQ(hand.changeActiveRegion(channels.pixels, kM), kPixelRegionVolumeDown);
    hand = holdInPlayPause({0, 100, 50, 50});
    EXPECT_EQ(hand.changeActiveRegion(channels.pixels, kI), kPixelRegionPlayPause);
}

} // namespace
} // namespace ZorvaTouch

#include "Shared/HandStats.h"

#include "Tests/Support/HandFrames.h"

#include <string>
#include <vector>

#include <gtest/gtest.h>

// Whole gestures, one row per frame.

namespace ZorvaTouch {
namespace {

using Testing::Channels;
using Testing::giveEveryFrameTheScore;
using Testing::step;

/// The raised flags by name, in a fixed order.
std::string raisedFlags(const HandStats &hand) {
    struct Flag {
        bool HandStats::*flag;
        const char *name;
    };
    constexpr Flag kFlags[] = {
        {&HandStats::isTouching, "touch"},
        {&HandStats::wasTouching, "wasTouch"},
        {&HandStats::isAboveFloor, "floor"},
        {&HandStats::wasAboveFloor, "wasFloor"},
        {&HandStats::isHolding, "hold"},
        {&HandStats::wasHolding, "wasHold"},
        {&HandStats::isHoldSuppressed, "suppressed"},
        {&HandStats::wasHoldSuppressed, "wasSuppressed"},
        {&HandStats::isPastHoldTimeout, "past"},
        {&HandStats::wasPastHoldTimeout, "wasPast"},
        {&HandStats::isTapCandidate, "candidate"},
        {&HandStats::isTap, "tap"},
        {&HandStats::isTapRejected, "rejected"},
    };
    std::string names;
    for (const Flag &flag : kFlags)
        if (hand.*flag.flag)
            names += (names.empty() ? "" : " ") + std::string(flag.name);
    return names;
}

struct FrameRow {
    std::uint32_t timeMs;
    Channels channels;
    float score; ///< of the classifier in this frame, if it runs
    const char *flags;
};

/// Plays the frames, with all times moved by `offsetMs`.
void expectFrames(HandStats &hand, const std::vector<FrameRow> &rows, std::uint32_t offsetMs = 0) {
    for (const FrameRow &row : rows) {
        giveEveryFrameTheScore(hand, row.score);
        step(hand, row.channels, row.timeMs + offsetMs);
        EXPECT_EQ(raisedFlags(hand), row.flags) << "at " << row.timeMs << " ms";
    }
}

const Channels kIdle;
const Channels kBrush = Channels().brush('A', 100);
const Channels kFinger = Channels().press('A', 300);
const Channels kWeakFinger = Channels().press('A', 201);
const Channels kFirmFinger = Channels().press('A', 600);

const std::vector<FrameRow> kTap{
    {1000, kIdle, 1, ""},
    {1010, kBrush, 1, "floor"},
    {1020, kFinger, 1, "touch floor wasFloor"},
    {1120, kFinger, 1, "touch wasTouch floor wasFloor"},
    {1130, kIdle, 1, "wasTouch wasFloor candidate tap"},
};

TEST(HandSequence, Tap) {
    HandStats hand;
    expectFrames(hand, kTap);
    EXPECT_EQ(hand.touchStartTime, 1020u);
    EXPECT_EQ(hand.touchEndTime, 1130u);
    EXPECT_EQ(hand.tapStrength, 300.0f);
    EXPECT_EQ(hand.strengthDurationRatio, 1.99000001f);      // 300 / 120 - 0.51
    EXPECT_EQ(hand.timeDurationRatio, 0.666666687f);         // 110 / 120 - 0.25
    EXPECT_EQ(hand.touchStrengthDurationRatio, 2.07727289f); // 300 / 110 - 0.65
    EXPECT_EQ(hand.tapSvmScore, 3.91429472f);
    EXPECT_EQ(hand.lastEventTime, 1130u);
    EXPECT_EQ(hand.lastEventRegion, kPixelRegionPlayPause);
    expectFrames(hand, {{1140, kIdle, 1, ""}, {1150, kIdle, 1, ""}});
    EXPECT_EQ(hand.lastEventTime, 1130u);
}

TEST(HandSequence, TapWhileTheClockWraps) {
    HandStats hand;
    constexpr std::uint32_t kOffset = 4294966221u; // 2^32 - 1075: the finger comes 55 ms before the wrap
    hand.lastEventTime = kOffset;                  // as long ago as in the plain tap
    expectFrames(hand, kTap, kOffset);
    EXPECT_EQ(hand.touchStartTime, 4294967241u);
    EXPECT_EQ(hand.touchEndTime, 55u);
    EXPECT_EQ(hand.strengthDurationRatio, 1.99000001f);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 2.07727289f);
    EXPECT_EQ(hand.tapSvmScore, 3.91429472f);
    EXPECT_EQ(hand.lastEventTime, 55u);
}

const std::vector<FrameRow> kHold{
    {1000, kFinger, 1, "touch floor"},
    {1500, kFinger, 1, "touch wasTouch floor wasFloor"},
    {1501, kFinger, 1, "touch wasTouch floor wasFloor hold past"},
    {1600, kFinger, 1, "touch wasTouch floor wasFloor hold wasHold past wasPast"},
    {1610, kFinger, -90, "touch wasTouch floor wasFloor hold wasHold past wasPast"}, // the score falls to -86
    {1700, kIdle, 1, "wasTouch wasFloor wasHold wasPast"},
    {1710, kIdle, 1, ""},
};

TEST(HandSequence, Hold) {
    HandStats hand;
    expectFrames(hand, kHold);
    EXPECT_EQ(hand.touchScore, -86.0f);
    EXPECT_EQ(hand.lastEventTime, 1700u);
    EXPECT_EQ(hand.lastEventRegion, kPixelRegionPlayPause);
}

TEST(HandSequence, HoldWhileTheClockWraps) {
    HandStats hand;
    constexpr std::uint32_t kOffset = 4294966096u; // 2^32 - 1200
    expectFrames(hand, kHold, kOffset);
    EXPECT_EQ(hand.touchStartTime, 4294967096u);
    EXPECT_EQ(hand.lastEventTime, 500u);
}

TEST(HandSequence, HoldWithoutSuppression) {
    HandStats hand;
    hand.enableHoldSuppression = false;
    expectFrames(hand, {{1000, kFirmFinger, -5, "touch floor"},
                        {1500, kFirmFinger, -5, "touch wasTouch floor wasFloor"},
                        {1501, kFirmFinger, -5, "touch wasTouch floor wasFloor hold"},
                        {1600, kFirmFinger, -5, "touch wasTouch floor wasFloor hold wasHold"},
                        {1700, kIdle, -5, "wasTouch wasFloor wasHold candidate tap"}, // both: meant
                        {1710, kIdle, -5, ""}});
    EXPECT_EQ(hand.lastEventTime, 1700u);
}

TEST(HandSequence, SuppressedHold) {
    HandStats hand;
    expectFrames(hand,
                 {{1000, kFinger, -1, "touch floor"},
                  {1500, kFinger, -1, "touch wasTouch floor wasFloor"},
                  {1501, kFinger, -1, "touch wasTouch floor wasFloor suppressed past"},
                  {1510, kFinger, -1, "touch wasTouch floor wasFloor suppressed wasSuppressed past wasPast"},
                  {1700, kIdle, -1, "wasTouch wasFloor wasSuppressed wasPast"},
                  {1710, kIdle, -1, ""}});
    EXPECT_EQ(hand.lastEventTime, 0u);
}

TEST(HandSequence, SuppressedHoldThatRecovers) {
    HandStats hand;
    const std::vector<FrameRow> rows{
        {1000, kFinger, -1, "touch floor"},                                                        // score -1
        {1501, kFinger, -1, "touch wasTouch floor wasFloor suppressed past"},                      // -2
        {1510, kFinger, 1, "touch wasTouch floor wasFloor suppressed wasSuppressed past wasPast"}, // -1
        {1520, kFinger, 1, "touch wasTouch floor wasFloor hold wasSuppressed past wasPast"}, // 0 is enough
        {1530, kFinger, -50, "touch wasTouch floor wasFloor hold wasHold past wasPast"},     // -50
        {1540, kIdle, 1, "wasTouch wasFloor wasHold wasPast"},
        {1550, kIdle, 1, ""},
    };
    expectFrames(hand, rows);
    EXPECT_EQ(hand.lastEventTime, 1540u);
}

TEST(HandSequence, TouchOfExactlyTheTimeoutIsATap) {
    HandStats hand;
    const Channels finger = Channels().press('A', 400); // 400 / 600 = 0.667: firm enough for 600 ms
    expectFrames(hand, {{1000, finger, -1, "touch floor"},
                        {1500, finger, -1, "touch wasTouch floor wasFloor"},
                        {1600, kIdle, -1, "wasTouch wasFloor candidate tap"}});
    EXPECT_EQ(hand.strengthDurationRatio, 0.156666696f);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 0.0166667104f);
}

TEST(HandSequence, RejectedTap) {
    HandStats hand;
    expectFrames(hand, {{1000, kWeakFinger, 1, "touch floor"},
                        {1200, kWeakFinger, 1, "touch wasTouch floor wasFloor"},
                        {1400, kIdle, 1, "wasTouch wasFloor candidate rejected"},
                        {1410, kIdle, 1, ""}});
    EXPECT_EQ(hand.lastEventTime, 0u);
}

TEST(HandSequence, RejectedTapWithoutTapSuppression) {
    HandStats hand;
    hand.enableTapSuppression = false;
    expectFrames(hand, {{1000, kWeakFinger, 1, "touch floor rejected"},
                        {1200, kWeakFinger, 1, "touch wasTouch floor wasFloor rejected"},
                        {1400, kIdle, 1, "wasTouch wasFloor candidate tap rejected"},
                        {1410, kIdle, 1, "rejected"}});
    EXPECT_EQ(hand.lastEventTime, 1400u);
}

TEST(HandSequence, TouchInTheMillisecondOfTheLastEventIsRejected) {
    HandStats hand;
    expectFrames(hand, {{1000, kFinger, 1, "touch floor"},
                        {1100, kIdle, 1, "wasTouch wasFloor candidate tap"},
                        {1100, kFinger, 1, "touch floor"},
                        {1100, kIdle, 1, "wasTouch wasFloor candidate rejected"}}); // neither span nor length
    EXPECT_EQ(hand.strengthDurationRatio, 0.0f);
    EXPECT_EQ(hand.timeDurationRatio, 0.0f);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 0.0f);
}

TEST(HandSequence, TapWhoseFloorBeginsWithItsEndHasNoSpan) {
    HandStats hand;
    Channels faint; // touched below the floor, as with a low activation threshold
    faint.electrode('A').isTouched = faint.electrode('A').wasTouched = true;
    faint.electrode('A').normalizedValue = 0.5f;
    Channels above = Channels().brush('A', 76);
    above.electrode('A').wasTouched = true;
    expectFrames(hand, {{1000, faint, 1, "touch"}, {1100, above, 1, "wasTouch floor candidate tap"}});
    EXPECT_EQ(hand.floorStartTime, 1100u);
    EXPECT_EQ(hand.strengthDurationRatio, 0.0f);
    EXPECT_EQ(hand.timeDurationRatio, 0.0f);
    EXPECT_EQ(hand.touchStrengthDurationRatio, 0.350000024f); // 100 / 100 - 0.65
    EXPECT_EQ(hand.tapSvmScore, 1.54900002f);
}

struct RegionRow {
    std::uint32_t timeMs;
    Channels channels;
    PixelRegion region;
};

void expectRegions(HandStats &hand, const std::vector<RegionRow> &rows) {
    for (const RegionRow &row : rows) {
        step(hand, row.channels, row.timeMs);
        EXPECT_EQ(hand.activeRegion, row.region) << "at " << row.timeMs << " ms";
    }
}

TEST(HandSequence, ATouchSoonAfterATapStaysInItsRegion) {
    HandStats hand;
    giveEveryFrameTheScore(hand, 1);
    const Channels volumeUp = Channels().press('I', 300);
    const Channels between = Channels().press('A', 300).brush('I', 200); // I has two thirds of A
    expectRegions(hand, {{1000, volumeUp, kPixelRegionVolumeUp}, {1100, kIdle, kPixelRegionVolumeUp}});
    ASSERT_TRUE(hand.isTap);
    hand.Reset();
    expectRegions(hand, {{1390, between, kPixelRegionVolumeUp},
                         {1400, between, kPixelRegionVolumeUp},    // 300 ms: bias 0.65
                         {1500, between, kPixelRegionPlayPause}}); // 400 ms: bias 0.65 + 0.35 / 7 = 0.7
}

TEST(HandSequence, ATouchLongAfterATapHasItsOwnRegion) {
    HandStats hand;
    giveEveryFrameTheScore(hand, 1);
    const Channels between = Channels().press('A', 300).brush('I', 299);
    expectRegions(hand, {{1000, Channels().press('I', 300), kPixelRegionVolumeUp},
                         {1100, kIdle, kPixelRegionVolumeUp}});
    ASSERT_TRUE(hand.isTap);
    hand.Reset();
    expectRegions(hand, {{2099, between, kPixelRegionPlayPause}, {2100, between, kPixelRegionPlayPause}});
}

TEST(HandSequence, ElectrodeKFollowsItsNeighbours) {
    // K at 1.5, of which 0.7 is 1.05; the neighbours at 0.4, above the floor of 0.375.
    const Channels withM = Channels().press('K', 300).brush('M', 80);
    const Channels withI = Channels().press('K', 300).brush('I', 80);
    HandStats hand;
    giveEveryFrameTheScore(hand, 1);
    expectRegions(hand, {{1000, Channels(withM).remember("KLM", 1.04f), kPixelRegionPlayPause},
                         {1010, Channels(withM).remember("KLM", 1.06f), kPixelRegionVolumeDown},
                         {1020, Channels(withI).remember("IJK", 1.04f), kPixelRegionPlayPause},
                         {1030, Channels(withI).remember("IJK", 1.06f), kPixelRegionVolumeUp},
                         {1040, kIdle, kPixelRegionVolumeUp}});
    ASSERT_TRUE(hand.isTap);
    hand.Reset();
    // Soon after a tap in volume up 0.65 of K, 0.975, is enough for I, but not for M.
    expectRegions(hand, {{1100, Channels(withI).remember("IJK", 0.98f), kPixelRegionVolumeUp},
                         {1110, Channels(withM).remember("KLM", 0.98f), kPixelRegionPlayPause},
                         {1120, Channels(withI).remember("IJK", 0.97f), kPixelRegionPlayPause}});
}

struct MoveRow {
    std::int32_t a, g; ///< counts above the floor
    PixelRegion region;
    float switchFactor;
};

TEST(HandSequence, AHoldMovesWhenTheOtherRegionHasGainedEnoughInOneFrame) {
    constexpr PixelRegion stays = kPixelRegionPlayPause, moves = kPixelRegionVolumeUp;
    // The hold is on A with G equally strong, 100 above the floor each: the ratio before is 1.
    const std::vector<MoveRow> rows{
        {100, 129, stays, 1.3f},       {100, 130, moves, 1.3f},
        {80, 103, stays, 1.3f},                                       // A down by 0.2: 103 / 80 = 1.29
        {80, 104, moves, 1.3f},        {65, 204, stays, 3.14999986f}, // by 0.35: 204 / 65 = 3.138
        {65, 205, moves, 3.14999986f},                                // 3.154
        {50, 249, stays, 5.0f},                                       // by 0.5
        {50, 250, moves, 5.0f},        {0, 1, moves, 1.3f},           // gone: no factor is computed
        {100, 100, stays, 1.3f}                                       // A comes first: not even a candidate
    };
    const auto frame = [](std::int32_t a, std::int32_t g) {
        return Channels().press('A', 75 + a).press('G', 75 + g);
    };
    for (const MoveRow &row : rows) {
        SCOPED_TRACE(std::to_string(row.a) + ", " + std::to_string(row.g));
        HandStats hand;
        giveEveryFrameTheScore(hand, 1);
        expectRegions(hand, {{1000, frame(100, 100), stays},
                             {1501, frame(100, 100), stays}, // the hold begins
                             {1510, frame(row.a, row.g), row.region}});
        EXPECT_TRUE(hand.isHolding);
        EXPECT_EQ(hand.previousActiveRegion, kPixelRegionPlayPause);
        EXPECT_EQ(hand.regionSwitchFactor, row.switchFactor);
    }
}

TEST(HandSequence, AHoldIsComparedWithTheLastFrameThatHadACandidate) {
    const auto frame = [](std::int32_t a, std::int32_t g) {
        return Channels().press('A', 75 + a).press('G', 75 + g);
    };
    HandStats hand;
    giveEveryFrameTheScore(hand, 1);
    expectRegions(hand, {{1000, frame(100, 100), kPixelRegionPlayPause},
                         {1501, frame(100, 100), kPixelRegionPlayPause},
                         {1510, frame(200, 10), kPixelRegionPlayPause},   // no candidate: nothing is noted
                         {1520, frame(100, 129), kPixelRegionPlayPause},  // 1.29 against 1
                         {1530, frame(100, 160), kPixelRegionPlayPause},  // 1.6 against 1.29 * 1.3 = 1.677
                         {1540, frame(100, 209), kPixelRegionVolumeUp},   // 2.09 against 1.6 * 1.3 = 2.08
                         {1550, frame(100, 209), kPixelRegionVolumeUp}}); // settled
    EXPECT_EQ(hand.previousActiveRegion, kPixelRegionVolumeUp);
}

} // namespace
} // namespace ZorvaTouch

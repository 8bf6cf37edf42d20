#include "Tools/Cli/FingerTruth.h"

#include <gtest/gtest.h>

// The finger of scenario day, seed 1811, pauses times 0.15, as `synth` labels it, in ms of the sensor's
// clock:
//   Tap 1 (play/pause)   300 to 685
//   Hold 1              1818 to 3163
//   Graze 0             3802 to 3897
//   Hold 2 (down)      10660 to 14944, with slides to 1 at 11873 to 12132, to 3 (up) at 12891 to 13080, and
//   to 1
//                      at 13881 to 14071

namespace ZorvaTouch::Tools {
namespace {

constexpr std::uint64_t kMs = 1'000'000;

SimulatedFinger finger() {
    const Synth::Scenario &day = *Synth::scenarioNamed("day");
    SimulatedFinger finger{
        .scenario = &day, .parameters = Synth::parametersOf(day), .seed = 1811, .seconds = 20};
    finger.parameters.pauseScale = 0.15;
    return finger;
}

TEST(FingerTruth, SaysWhatIsBehindAGesture) {
    FingerTruth truth(finger());
    EXPECT_EQ(truth.behind(Gesture::Tap, 670 * kMs), "tap play/pause");
    EXPECT_EQ(truth.behind(Gesture::HoldStart, 2361 * kMs), "hold play/pause"); // which goes on for a second
    EXPECT_EQ(truth.behind(Gesture::Tap, 3840 * kMs), "graze");                 // and should be no tap
    EXPECT_EQ(truth.behind(Gesture::HoldStart, 11200 * kMs), "hold volume down");
    EXPECT_EQ(truth.behind(Gesture::HoldChange, 12020 * kMs), "slide play/pause");
    EXPECT_EQ(truth.behind(Gesture::HoldChange, 12980 * kMs), "slide volume up");
}

TEST(FingerTruth, KnowsOfNothingWhereNothingIs) {
    FingerTruth truth(finger());
    EXPECT_EQ(truth.behind(Gesture::Tap, 200 * kMs), "");
    EXPECT_EQ(truth.behind(Gesture::Tap, 1500 * kMs), "");
    EXPECT_EQ(truth.behind(Gesture::Tap, 60'000 * kMs), ""); // behind the finger's end
}

TEST(FingerTruth, EndsOfHoldsAndResetsAreNobodysDoing) {
    FingerTruth truth(finger());
    EXPECT_EQ(truth.behind(Gesture::HoldEnd, 3150 * kMs), "");
    EXPECT_EQ(truth.behind(Gesture::Reset, 3150 * kMs), "");
}

TEST(FingerTruth, TellsOnceWhatNoGestureToldOf) {
    FingerTruth truth(finger());
    EXPECT_TRUE(truth.takeSilences(800 * kMs).empty()); // the tap's gesture may still come
    const auto first = truth.takeSilences(900 * kMs);
    ASSERT_EQ(first.size(), 1u);
    EXPECT_EQ(first[0].what, "tap play/pause");
    EXPECT_EQ(first[0].endNs / kMs, 675u); // 685 ms, but the first frame is an image of 10 ms
    EXPECT_TRUE(first[0].isMissed);
    EXPECT_TRUE(truth.takeSilences(901 * kMs).empty());
}

TEST(FingerTruth, AnAccidentWithoutAGestureIsNotMissed) {
    FingerTruth truth(finger());
    static_cast<void>(truth.takeSilences(3700 * kMs));
    const auto silences = truth.takeSilences(4500 * kMs);
    ASSERT_EQ(silences.size(), 1u);
    EXPECT_EQ(silences[0].what, "graze");
    EXPECT_FALSE(silences[0].isMissed);
}

TEST(FingerTruth, WhatAGestureToldOfIsNoSilence) {
    FingerTruth truth(finger());
    static_cast<void>(truth.behind(Gesture::Tap, 670 * kMs));
    EXPECT_TRUE(truth.takeSilences(1700 * kMs).empty());
}

} // namespace
} // namespace ZorvaTouch::Tools

#include "Shared/Algs.h"

#include "Tests/Support/FramesScript.h"
#include "Tests/Support/RecordingFakes.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>

// The scripts below mostly press electrode H, whose gain is 1, so that its value is the input:
//
//   H 500   a firm finger: every frame scores +2.118
//   H 300   a light finger: every frame scores -0.078, so that a hold is refused
//   H 210   hardly a touch: the default activation threshold is 200

namespace ZorvaTouch {
namespace {

using Scripted::electrodes;
using Scripted::Electrodes;
using Scripted::eventsText;
using Scripted::expectGesture;
using Scripted::FrameFeeder;
using Scripted::imageReport;

InputReport::Image imageOf(const std::vector<std::uint8_t> &report) {
    return InputReport::Image::parse(report.data(), report.size()).value();
}

class AlgsFrames : public ::testing::Test {
protected:
    Scripted::CapturingLogProvider logs;
    Algs algs{logs};
};

using AlgsDecision = AlgsFrames;
using AlgsReset = AlgsFrames;
using AlgsDebugLog = AlgsFrames;

// --- Frames --------------------------------------------------------------------------------------

TEST_F(AlgsFrames, AFreshRecognizerIsIdle) {
    EXPECT_FALSE(algs.handStats().isTouching);
    EXPECT_EQ(algs.lastEventPhase(), 0);
    EXPECT_EQ(algs.eventStats().numTaps, 0u);
    for (std::size_t i = 0; i < kElectrodeCount; ++i)
        EXPECT_EQ(algs.pixels()[i].index, static_cast<std::int32_t>(i));
    EXPECT_EQ(algs.virtualPixels()[2].name, "ADEF");
    EXPECT_EQ(algs.virtualPixels()[2].gain, 0.6667f);
    EXPECT_EQ(algs.virtualPixels()[12].index, 69) << "the code of the E of EKL, until the first frame";
}

TEST_F(AlgsFrames, BuiltInGainsScaleTheElectrodes) {
    Electrodes all{};
    all.fill(1000);
    FrameFeeder(algs).frame(1000, all);
    const std::array<std::int32_t, kElectrodeCount> values{1921, 1883, 1928, 1883, 1916, 1810, 1008, 1000,
                                                           1485, 1503, 2415, 1537, 1543, 1040, 1049};
    for (std::size_t i = 0; i < kElectrodeCount; ++i)
        EXPECT_EQ(algs.pixels()[i].value, values[i]) << "electrode " << i;
}

TEST_F(AlgsFrames, VirtualPixelsTakeSumFactorAndDominantElectrode) {
    // A 150 x 1.9219 = 288, E 100 x 1.9163 = 191; ABE sums to 479, x 0.6667 = 319.3.
    FrameFeeder(algs).frame(1000, {{'A', 150}, {'E', 100}});
    EXPECT_EQ(algs.virtualImage().values[0], 479);
    EXPECT_EQ(algs.virtualPixels()[0].value, 319);
    EXPECT_EQ(algs.virtualPixels()[0].index, 0);
    // EFK has E alone: 191 x 0.4 = 76.4, just above the noise floor.
    EXPECT_EQ(algs.virtualPixels()[10].value, 76);
    EXPECT_EQ(algs.virtualPixels()[10].index, 4);
    EXPECT_TRUE(algs.virtualPixels()[10].isAboveFloor);
    EXPECT_EQ(algs.virtualPixels()[22].index, 12) << "MNO keeps its first member";
}

TEST_F(AlgsFrames, VirtualSumsWrapAtSixteenBits) {
    // 19219 + 18837 + 19163 + 18105 = 75324, less 65536 is 9788; x 0.6667 = 6525.7. That is meant.
    FrameFeeder(algs).frame(1000, {{'A', 10000}, {'D', 10000}, {'E', 10000}, {'F', 10000}});
    EXPECT_EQ(algs.virtualImage().values[2], 75324) << "the image itself is not narrowed";
    EXPECT_EQ(algs.virtualPixels()[2].value, 6525);
    // ABE: 19219 + 19163 = 38382, less 65536 is -27154; x 0.6667 = -18103.6.
    EXPECT_EQ(algs.virtualPixels()[0].value, -18103);
}

TEST_F(AlgsFrames, ExtremeInputsAreFrames) {
    Electrodes all{};
    FrameFeeder feeder(algs);
    all.fill(std::numeric_limits<std::int16_t>::min());
    EXPECT_EQ(feeder.frame(1000, all), "");
    EXPECT_EQ(algs.pixels()[10].value, -79147) << "-32768 x 2.4154 = -79147.8";
    EXPECT_EQ(algs.virtualPixels()[18].value, 0) << "members below the floor add nothing";
    all.fill(std::numeric_limits<std::int16_t>::max());
    feeder.frame(1010, all);
    EXPECT_TRUE(algs.handStats().isTouching);
    EXPECT_EQ(algs.handStats().touchScore, 100.0f);
}

TEST_F(AlgsFrames, FramesWithoutATouchSayNothing) {
    FrameFeeder feeder(algs);
    for (std::uint32_t t = 0; t < 2000; t += 10)
        EXPECT_EQ(feeder.frame(t, {}), "");
    EXPECT_EQ(algs.eventStats().numTaps, 0u);
}

TEST_F(AlgsFrames, EventsAreAppendedToTheList) {
    const auto earlier = Algs::createCancelEvent();
    HostEventList events{earlier};
    const Electrodes finger = electrodes({{'H', 300}});
    algs.processTouchFrame(finger, 57, 1000, events);
    ASSERT_EQ(events.size(), 2u);
    EXPECT_EQ(events[0], earlier);
    EXPECT_EQ(Scripted::eventText(*events[1]), "may-begin 3");
    EXPECT_FALSE(earlier->integerField(kDigitizerFieldFrameNumber).has_value())
        << "only the new event is stamped";
}

TEST_F(AlgsFrames, EventsCarryTheirFrameNumber) {
    const auto events = algs.handleImage(imageOf(imageReport(0xFFFFFFFE, 1000, electrodes({{'H', 300}}))));
    ASSERT_EQ(events.size(), 1u);
    EXPECT_EQ(events[0]->integerField(0xB001B), 4294967294);
    EXPECT_EQ(events[0]->timestamp(), 0u) << "the pipeline stamps the time";
}

TEST_F(AlgsFrames, AnImageIsItsSignalsNumberAndTime) {
    InputReport::Image image = imageOf(imageReport(8, 1000, electrodes({{'H', 300}})));
    image.flags = {255, 255, 255, 255};
    EXPECT_EQ(eventsText(algs.handleImage(image)), "may-begin 3");
    EXPECT_EQ(algs.pixels()[7].value, 300);
    EXPECT_EQ(algs.pixels()[0].value, 0) << "raw counts are not touches";
    EXPECT_EQ(algs.handStats().touchStartTime, 1000u);
}

TEST_F(AlgsFrames, LastEventPhaseFollowsTheEvents) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 500}});
    EXPECT_EQ(algs.lastEventPhase(), 128);
    feeder.frame(1010, {{'H', 500}});
    EXPECT_EQ(algs.lastEventPhase(), 128) << "a frame without an event leaves it";
    feeder.frame(1501, {{'H', 500}});
    EXPECT_EQ(algs.lastEventPhase(), 1);
    feeder.frame(1510, {{'N', 400}});
    EXPECT_EQ(algs.lastEventPhase(), 2);
    feeder.frame(1520, {});
    EXPECT_EQ(algs.lastEventPhase(), 4) << "it survives the reset at the touch's end";
    feeder.frame(3000, {{'H', 500}});
    feeder.frame(3010, {});
    EXPECT_EQ(algs.lastEventPhase(), 0) << "a tap carries no phase";
    feeder.frame(5000, {{'H', 210}});
    feeder.frame(5400, {});
    EXPECT_EQ(algs.lastEventPhase(), 8);
}

// --- The decision, row by row --------------------------------------------------------------------

TEST_F(AlgsDecision, AShortTouchIsATap) {
    expectGesture(algs, {
                            {1000, electrodes({{'H', 300}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                            {1010, electrodes({{'H', 300}}), "", "TOUCHING 10ms ActiveRegion=3"},
                            {1020, {}, "tap 3", "TAP 20ms ActiveRegion=3 BELOWNOISE"},
                            {1030, {}, "", ""},
                        });
    EXPECT_EQ(algs.eventStats().numTaps, 1u);
    EXPECT_EQ(algs.eventStats().numVolumeUp, 1u);
}

TEST_F(AlgsDecision, TapsTellTheirRegion) {
    expectGesture(algs, {
                            {1000, electrodes({{'K', 150}}), "may-begin 1", "STARTTOUCH 0ms ActiveRegion=1"},
                            {1020, {}, "tap 1", "TAP 20ms ActiveRegion=1 BELOWNOISE"},
                            {5000, electrodes({{'N', 300}}), "may-begin 2", "STARTTOUCH 0ms ActiveRegion=2"},
                            {5020, {}, "tap 2", "TAP 20ms ActiveRegion=2 BELOWNOISE"},
                        });
    EXPECT_EQ(algs.eventStats().numPlayPause, 1u);
    EXPECT_EQ(algs.eventStats().numVolumeDown, 1u);
}

TEST_F(AlgsDecision, ATapReleasedIntoNoiseSaysSo) {
    // H falls to 100, a third of the peak and below its 0.6, but above the noise floor of 75.
    expectGesture(algs, {
                            {1000, electrodes({{'H', 300}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                            {1010, electrodes({{'H', 100}}), "tap 3", "TAP 10ms ActiveRegion=3 ABOVENOISE"},
                        });
}

TEST_F(AlgsDecision, AWeakLongTouchIsCancelled) {
    // tsd = 210 / 400 - 0.65 is negative, so the tap is rejected.
    expectGesture(algs, {
                            {1000, electrodes({{'H', 210}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                            {1200, electrodes({{'H', 210}}), "", "TOUCHING 200ms ActiveRegion=3"},
                            {1400, {}, "cancel", "SUPPRESSTAP 400ms ActiveRegion=3 BELOWNOISE"},
                            {1410, {}, "", ""},
                        });
    EXPECT_EQ(algs.eventStats().numRejectedTap, 1u);
    EXPECT_EQ(algs.eventStats().numRejectedVolumeUp, 1u);
    EXPECT_EQ(algs.eventStats().numTaps, 0u);
}

TEST_F(AlgsDecision, WithoutTapSuppressionAWeakLongTouchIsATap) {
    algs.setState("EnableTapSuppression", false);
    expectGesture(algs, {
                            {1000, electrodes({{'H', 210}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                            {1400, {}, "tap 3", "TAP 400ms ActiveRegion=3 BELOWNOISE"},
                        });
}

TEST_F(AlgsDecision, ATouchOfExactlyTheTimeOutIsStillATap) {
    expectGesture(algs, {
                            {1000, electrodes({{'H', 500}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                            {1500, electrodes({{'H', 500}}), "", "TOUCHING 500ms ActiveRegion=3"},
                            {1510, {}, "tap 3", "TAP 510ms ActiveRegion=3 BELOWNOISE"},
                        });
}

TEST_F(AlgsDecision, ALongTouchIsAHoldAndEndsOnce) {
    expectGesture(algs,
                  {
                      {1000, electrodes({{'H', 500}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                      {1500, electrodes({{'H', 500}}), "", "TOUCHING 500ms ActiveRegion=3"},
                      {1501, electrodes({{'H', 500}}), "hold-start 3", "STARTHOLD 501ms ActiveRegion=3"},
                      {1600, electrodes({{'H', 500}}), "", "HOLDING 600ms ActiveRegion=3"},
                      {1700, {}, "hold-end 3", "ENDHOLD 700ms ActiveRegion=3 BELOWNOISE"},
                      {1710, {}, "", ""},
                  });
}

TEST_F(AlgsDecision, TheTimeOutIsMeasuredAcrossTheClocksWrap) {
    // 4294967040 is 256 before the wrap: 244 is 500 ms later, 245 is 501.
    expectGesture(algs,
                  {
                      {4294967040, electrodes({{'H', 500}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                      {244, electrodes({{'H', 500}}), "", "TOUCHING 500ms ActiveRegion=3"},
                      {245, electrodes({{'H', 500}}), "hold-start 3", "STARTHOLD 501ms ActiveRegion=3"},
                      {300, {}, "hold-end 3", "ENDHOLD 556ms ActiveRegion=3 BELOWNOISE"},
                  });
}

TEST_F(AlgsDecision, AHoldThatMovesTellsTheNewRegionOnce) {
    expectGesture(algs,
                  {
                      {1000, electrodes({{'H', 500}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                      {1501, electrodes({{'H', 500}}), "hold-start 3", "STARTHOLD 501ms ActiveRegion=3"},
                      {1600, electrodes({{'N', 400}}), "hold-change 2", "HOLDING 600ms ActiveRegion=2"},
                      {1610, electrodes({{'N', 400}}), "", "HOLDING 610ms ActiveRegion=2"},
                      {1620, electrodes({{'K', 400}}), "hold-change 1", "HOLDING 620ms ActiveRegion=1"},
                      {1630, electrodes({{'K', 400}}), "", "HOLDING 630ms ActiveRegion=1"},
                      {1700, {}, "hold-end 1", "ENDHOLD 700ms ActiveRegion=1 BELOWNOISE"},
                  });
    const EventStats &stats = algs.eventStats();
    EXPECT_EQ(stats.numBeginHold, 1u);
    EXPECT_EQ(stats.numIncrementHold, 4u) << "one per frame, not one per change";
    EXPECT_EQ(stats.numVolumeIncrement, 1u);
    EXPECT_EQ(stats.numVolumeDecrement, 2u);
    EXPECT_EQ(stats.numKeloCallIncrement, 2u);
    EXPECT_EQ(stats.numEndHold, 1u);
}

TEST_F(AlgsDecision, AHoldReleasedIntoNoiseSaysSo) {
    expectGesture(
        algs, {
                  {1000, electrodes({{'H', 500}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                  {1501, electrodes({{'H', 500}}), "hold-start 3", "STARTHOLD 501ms ActiveRegion=3"},
                  {1600, electrodes({{'H', 100}}), "hold-end 3", "ENDHOLD 600ms ActiveRegion=3 ABOVENOISE"},
              });
}

TEST_F(AlgsDecision, ASuppressedLongTouchIsCancelledAtItsEnd) {
    // H 300 scores below 0, so no hold begins; past the time-out the release is no tap candidate either.
    expectGesture(algs, {
                            {1000, electrodes({{'H', 300}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                            {1500, electrodes({{'H', 300}}), "", "TOUCHING 500ms ActiveRegion=3"},
                            {1501, electrodes({{'H', 300}}), "", "SUPPRESSHOLD 501ms ActiveRegion=3"},
                            {1600, electrodes({{'H', 300}}), "", "SUPPRESSHOLD 600ms ActiveRegion=3"},
                            {1610, {}, "cancel", "ENDTOUCH 610ms ActiveRegion=3 BELOWNOISE"},
                        });
    EXPECT_EQ(algs.eventStats().numRejectedBeginHold, 1u);
    EXPECT_EQ(algs.eventStats().numRejectedIncrementHold, 1u);
    EXPECT_EQ(algs.eventStats().numRejectedEndHold, 1u);
    EXPECT_EQ(algs.eventStats().numRejectedTap, 0u);
}

TEST_F(AlgsDecision, WithoutHoldSuppressionALightLongTouchIsAHold) {
    algs.setState("EnableHoldSuppression", false);
    expectGesture(algs,
                  {
                      {1000, electrodes({{'H', 300}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                      {1501, electrodes({{'H', 300}}), "hold-start 3", "STARTHOLD 501ms ActiveRegion=3"},
                  });
}

TEST_F(AlgsDecision, ASuppressedHoldThatRecoversBegins) {
    // 3 x -0.078 + 2.118 is positive again in the frame at 1520.
    expectGesture(algs,
                  {
                      {1000, electrodes({{'H', 300}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                      {1501, electrodes({{'H', 300}}), "", "SUPPRESSHOLD 501ms ActiveRegion=3"},
                      {1510, electrodes({{'H', 300}}), "", "SUPPRESSHOLD 510ms ActiveRegion=3"},
                      {1520, electrodes({{'H', 500}}), "hold-start 3", "STARTHOLD 520ms ActiveRegion=3"},
                      {1540, {}, "hold-end 3", "ENDHOLD 540ms ActiveRegion=3 BELOWNOISE"},
                  });
    EXPECT_EQ(algs.eventStats().numSuppressed2Holding, 1u);
    EXPECT_EQ(algs.eventStats().numBeginHold, 1u);
}

TEST_F(AlgsDecision, AHoldEndMasksATapOfTheSameFrame) {
    algs.setState("EnableHoldSuppression", false); // then every release is a tap candidate
    expectGesture(algs,
                  {
                      {1000, electrodes({{'H', 500}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                      {1501, electrodes({{'H', 500}}), "hold-start 3", "STARTHOLD 501ms ActiveRegion=3"},
                      {1510, {}, "hold-end 3", "ENDHOLD 510ms ActiveRegion=3 BELOWNOISE"},
                  });
    EXPECT_TRUE(algs.handStats().isTap) << "the tap that must not be seen";
    EXPECT_EQ(algs.eventStats().numTaps, 0u);
}

TEST_F(AlgsDecision, AHoldCanEndUnderTheFingerAndIsNotCancelledLater) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 500}});
    EXPECT_EQ(feeder.frame(1501, {{'H', 500}}), "hold-start 3");
    algs.setState("HoldTimeoutMilliseconds", 10000u);
    EXPECT_EQ(feeder.frame(1510, {{'H', 500}}), "hold-end 3");
    EXPECT_EQ(feeder.phrase(), "TOUCHING 510ms ActiveRegion=3");
    // The reset at the hold's end has left no strength, so the release is a rejected tap; the last event was
    // no may-begin, so there is nothing to cancel.
    EXPECT_EQ(feeder.frame(1520, {}), "");
    EXPECT_EQ(feeder.phrase(), "SUPPRESSTAP 520ms ActiveRegion=3 BELOWNOISE");
    EXPECT_EQ(algs.lastEventPhase(), 4);
}

TEST_F(AlgsDecision, ATouchThatGoesOnAfterItsHoldEndedCanBeATap) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 500}});
    feeder.frame(1501, {{'H', 500}});
    algs.setState("HoldTimeoutMilliseconds", 10000u);
    feeder.frame(1510, {{'H', 500}});
    EXPECT_EQ(feeder.frame(1515, {{'H', 500}}), "");
    EXPECT_EQ(feeder.frame(1520, {}), "tap 3");
}

TEST_F(AlgsDecision, EveryTouchEndClearsTheMeasurement) {
    struct Ending {
        const char *name;
        std::int16_t counts;
        std::uint32_t releaseTime;
        std::uint32_t holdTimeout;
    };
    // Released into noise that scores: without the reset the score of these frames would stay.
    for (const Ending &ending : {Ending{"tap", 500, 1020, 500}, Ending{"cancel", 210, 1400, 500},
                                 Ending{"hold end", 500, 1020, 5}}) {
        SCOPED_TRACE(ending.name);
        Algs fresh(logs);
        fresh.setState("HoldTimeoutMilliseconds", ending.holdTimeout);
        FrameFeeder feeder(fresh);
        feeder.frame(1000, {{'H', ending.counts}});
        feeder.frame(1010, {{'H', ending.counts}});
        EXPECT_NE(fresh.handStats().touchScore, 0.0f);
        EXPECT_NE(feeder.frame(ending.releaseTime, {{'H', 100}, {'I', 80}}), "");
        EXPECT_EQ(fresh.handStats().touchScore, 0.0f);
        EXPECT_EQ(fresh.handStats().maxTouchedValue, 0.0f);
        EXPECT_FALSE(fresh.pixels()[7].wasTouched);
        EXPECT_FALSE(fresh.pixels()[7].wasAboveFloor);
        EXPECT_TRUE(fresh.pixels()[7].isAboveFloor) << "only the sticky statistics go";
    }
}

TEST_F(AlgsDecision, ATouchWithoutAnEventAtItsEndClearsTheMeasurementToo) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 500}});
    feeder.frame(1501, {{'H', 500}});
    algs.setState("HoldTimeoutMilliseconds", 10000u);
    feeder.frame(1510, {{'H', 500}});
    EXPECT_EQ(feeder.frame(1520, {{'H', 100}, {'I', 80}}), "");
    EXPECT_EQ(algs.handStats().touchScore, 0.0f);
    EXPECT_FALSE(algs.pixels()[7].wasAboveFloor);
}

TEST_F(AlgsDecision, TheNextTouchStartsFromAClearedScore) {
    // Two touches with noise in between, so that no time passes below the floor and nothing decays.
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 500}});
    feeder.frame(1010, {{'H', 500}});
    EXPECT_FLOAT_EQ(algs.handStats().touchScore, 4.2363968f); // two frames of 2.1181984
    EXPECT_EQ(feeder.frame(1020, {{'H', 100}, {'I', 80}}), "tap 3");
    feeder.frame(1030, {{'H', 500}});
    EXPECT_FLOAT_EQ(algs.handStats().touchScore, 2.1181984f);
}

// --- Resets --------------------------------------------------------------------------------------

TEST_F(AlgsReset, ResetForgetsWhatIsMeasuredPerTouchAndNothingElse) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 500}});
    feeder.frame(1501, {{'H', 500}});
    algs.Reset();

    const HandStats &hand = algs.handStats();
    EXPECT_EQ(hand.touchScore, 0.0f);
    EXPECT_EQ(hand.tapStrength, 0.0f);
    EXPECT_EQ(hand.maxTouchedValue, 0.0f);
    EXPECT_EQ(hand.maxTouchedIndex, 0);
    const Pixel &h = algs.pixels()[7];
    EXPECT_FALSE(h.wasAboveFloor);
    EXPECT_FALSE(h.wasTouched);
    EXPECT_EQ(h.maxNormalizedValue, 0.0f);
    EXPECT_FALSE(algs.virtualPixels()[15].wasAboveFloor) << "GHI";
    EXPECT_EQ(algs.virtualPixels()[15].maxNormalizedValue, 0.0f);

    EXPECT_TRUE(h.isTouched);
    EXPECT_EQ(h.peakValue, 2.5f);
    EXPECT_TRUE(hand.isTouching);
    EXPECT_TRUE(hand.isHolding);
    EXPECT_EQ(hand.touchStartTime, 1000u);
    EXPECT_EQ(hand.activeRegion, kPixelRegionVolumeUp);
    EXPECT_EQ(hand.holdTimeoutMs, 500u);
    EXPECT_EQ(algs.lastEventPhase(), 1);
    EXPECT_EQ(algs.eventStats().numBeginHold, 1u);
}

TEST_F(AlgsReset, ADeviceResetWithoutATouchSaysNothing) { EXPECT_TRUE(algs.handleReset().empty()); }

TEST_F(AlgsReset, ADeviceResetInMidTouchCancelsWithFrameNumberZero) {
    // The zero frame comes at time 0: the time since the last event is 0 too, which rejects the tap.
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 300}});
    const auto events = algs.handleReset();
    EXPECT_EQ(eventsText(events), "cancel");
    EXPECT_EQ(events.at(0)->integerField(0xB001B), 0);
    EXPECT_EQ(algs.handStats().touchEndTime, 0u);
    EXPECT_TRUE(algs.handleReset().empty()) << "the touch is over";
}

TEST_F(AlgsReset, ADeviceResetInAShortTouchWithoutTapSuppressionIsATap) {
    algs.setState("EnableTapSuppression", false);
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 300}});
    EXPECT_EQ(eventsText(algs.handleReset()), "tap 3");
    const Electrodes nothing{};
    const std::string line = algs.touchStateDescription(nothing, 0);
    EXPECT_EQ(line.substr(line.find("] ")), "] TAP -1000ms ActiveRegion=3 BELOWNOISE")
        << "0 less 1000, as signed";
}

TEST_F(AlgsReset, ADeviceResetInMidHoldEndsTheHold) {
    for (const bool suppression : {true, false}) {
        Algs fresh(logs);
        fresh.setState("EnableHoldSuppression", suppression);
        fresh.setState("EnableTapSuppression", suppression);
        FrameFeeder feeder(fresh);
        feeder.frame(1000, {{'K', 400}});
        EXPECT_EQ(feeder.frame(1501, {{'K', 400}}), "hold-start 1");
        EXPECT_EQ(eventsText(fresh.handleReset()), "hold-end 1") << "suppression " << suppression;
    }
}

TEST_F(AlgsReset, ADeviceResetInASuppressedHoldCancels) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 300}});
    feeder.frame(1501, {{'H', 300}});
    EXPECT_EQ(eventsText(algs.handleReset()), "cancel");
}

TEST_F(AlgsReset, TouchesGoOnAfterADeviceReset) {
    // The sensor's clock starts again at 0; 20 ms at strength 300 is a tap as ever.
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 300}});
    (void)algs.handleReset();
    EXPECT_EQ(feeder.frame(40, {{'H', 300}}), "may-begin 3");
    EXPECT_EQ(feeder.frame(60, {}), "tap 3");
}

// --- Events --------------------------------------------------------------------------------------

void expectDigitizer(const HostEvent &event, std::uint32_t mask, std::uint16_t phase, double y) {
    ASSERT_NE(event.digitizer(), nullptr);
    EXPECT_EQ(event.type(), HostEventType::Digitizer);
    EXPECT_EQ(event.vendorDefined(), nullptr);
    EXPECT_EQ(event.timestamp(), 0u);
    EXPECT_EQ(event.options(), 0u);
    EXPECT_EQ(event.phase(), phase);
    const DigitizerFields &fields = *event.digitizer();
    EXPECT_EQ(fields.transducerType, 2u);
    EXPECT_EQ(fields.transducerIndex, 0u);
    EXPECT_EQ(fields.identity, 0u);
    EXPECT_EQ(fields.eventMask, mask);
    EXPECT_EQ(fields.buttonMask, 0u);
    EXPECT_EQ(fields.x, 0.0);
    EXPECT_EQ(fields.y, y);
    EXPECT_EQ(fields.z, 0.0);
    EXPECT_EQ(fields.tipPressure, 0.0);
    EXPECT_EQ(fields.barrelPressure, 0.0);
    EXPECT_FALSE(fields.inRange);
    EXPECT_FALSE(fields.touch);
    EXPECT_FALSE(event.integerField(0xB001B).has_value()) << "the recognizer sets it when it emits the event";
}

TEST(AlgsEvents, AreToldApartByMaskAndPhase) {
    const struct {
        PixelRegion region;
        double y;
    } regions[] = {{kPixelRegionNone, 0.0},
                   {kPixelRegionPlayPause, 1.0},
                   {kPixelRegionVolumeDown, 2.0},
                   {kPixelRegionVolumeUp, 3.0}};
    for (const auto &[region, y] : regions) {
        SCOPED_TRACE(y);
        expectDigitizer(*Algs::createMayBeginEvent(region), 0, 128, y);
        expectDigitizer(*Algs::createHoldStartEvent(region), 2, 1, y);
        expectDigitizer(*Algs::createHoldChangeEvent(region), 2, 2, y);
        expectDigitizer(*Algs::createHoldEndEvent(region), 2, 4, y);
        expectDigitizer(*Algs::createTapEvent(region), 0x20000, 0, y);
    }
    expectDigitizer(*Algs::createCancelEvent(), 0, 8, 0.0);
}

TEST_F(AlgsFrames, ACancelForgetsTheTouchsRegion) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 210}});
    HostEventList events;
    const Electrodes nothing{};
    algs.processTouchFrame(nothing, 2, 1400, events);
    ASSERT_EQ(events.size(), 1u);
    EXPECT_EQ(events[0]->digitizer()->y, 0.0);
    EXPECT_EQ(events[0]->phase(), 8);
    EXPECT_EQ(algs.handStats().activeRegion, kPixelRegionVolumeUp);
}

// --- Descriptions of whole frames ----------------------------------------------------------------

TEST_F(AlgsFrames, DescribesATouchInProgress) {
    // A 150 x 1.9219 = 288.3 and E 100 x 1.9163 = 191.6; ABE and ADEF have both, 479 x 0.6667, and AEGJ 479 x
    // 0.5714; ABF has A alone, 288 x 0.4444 = 128, a rounded hair below; K is -40 x 2.4154 = -96.6. Eight
    // channels are only above the floor, E, ABF, BCEF, CDE, CELN, EFK, EJK and EKL: 21 - 8 = 13.
    const Electrodes signals = electrodes({{'A', 150}, {'E', 100}, {'K', -40}});
    FrameFeeder feeder(algs);
    feeder.frame(1000, signals);
    feeder.frame(1012, signals);
    const std::string head = "ts=8.676403, sd=0.000000, tsd=-0.650000, NonActivePixels=13, "
                             "TimeDurationRatio=0.000000, TapSVMScore=0.040200, ";
    EXPECT_EQ(
        algs.touchStateDescription(signals, 1012),
        head + "[A= 150  288<==ON, B=   0    0, C=   0    0, D=   0    0, E= 100  191, F=   0    0, "
               "G=   0    0, H=   0    0, I=   0    0, J=   0    0, K= -40  -96, L=   0    0, M=   0    0, "
               "N=   0    0, O=   0    0] TOUCHING 12ms ActiveRegion=1");
    EXPECT_EQ(
        algs.virtualStateDescription(signals, 1012),
        head + "[ABE= 319<==ON, ABF= 127, ADEF= 319<==ON, AEGJ= 273<==ON, BCEF= 127, BFHJ=   0, CDE= 127, "
               "CDF=   0, CELN= 127, DFLO=   0, EFK=  76, EJK=  76, EKL=  76, FJK=   0, FKL=   0, GHI=   0, "
               "GIJ=   0, HIJ=   0, IJK=   0, KLM=   0, LMN=   0, LMO=   0, MNO=   0] "
               "TOUCHING 12ms ActiveRegion=1");
}

TEST_F(AlgsFrames, DescribesASuppressedTapUpToTheGivenTime) {
    // sd = 210 / 400 - 0.51, tsd = 210 / 400 - 0.65, TimeDurationRatio = 400 / 400 - 0.25; GHI, BFHJ and HIJ
    // were above the floor only: 21 - 3. 0.1886 x 18 + 0.2772 x 0.015 + 2.7205 x 0.75 - 2.4116 = 3.027733.
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 210}});
    feeder.frame(1400, {{'H', 100}});
    const Electrodes shown =
        electrodes({{'A', 1}, {'O', -9}}); // what is shown as input is what was handed over
    EXPECT_EQ(algs.touchStateDescription(shown, 1450),
              "ts=0.000000, sd=0.015000, tsd=-0.125000, NonActivePixels=18, TimeDurationRatio=0.750000, "
              "TapSVMScore=3.027733, [A=   1    0, B=   0    0, C=   0    0, D=   0    0, E=   0    0, F=   "
              "0    0, "
              "G=   0    0, H=   0  100, I=   0    0, J=   0    0, K=   0    0, L=   0    0, M=   0    0, "
              "N=   0    0, O=  -9    0] SUPPRESSTAP 450ms ActiveRegion=3 ABOVENOISE");
}

TEST_F(AlgsFrames, DescribesWideNumbers) {
    // H = 12345 gives GHI and BFHJ 12345 x 0.5714 = 7053.9 and HIJ x 0.4 = 4938; A is -1234 x 1.9219 =
    // -2371.6. The touch began at 7 and the last touch's end is 0: tsd = 12345 / 4294967289 - 0.65.
    const Electrodes signals = electrodes({{'H', 12345}, {'A', -1234}});
    FrameFeeder feeder(algs);
    feeder.frame(7, signals);
    const std::string head = "ts=100.000000, sd=0.000000, tsd=-0.649997, NonActivePixels=21, "
                             "TimeDurationRatio=0.000000, TapSVMScore=1.549000, ";
    EXPECT_EQ(
        algs.touchStateDescription(signals, 7),
        head +
            "[A=-1234 -2371, B=   0    0, C=   0    0, D=   0    0, E=   0    0, F=   0    0, G=   0    0, "
            "H=12345 12345<==ON, I=   0    0, J=   0    0, K=   0    0, L=   0    0, M=   0    0, "
            "N=   0    0, O=   0    0] STARTTOUCH 0ms ActiveRegion=3");
    EXPECT_EQ(algs.virtualStateDescription(signals, 7),
              head +
                  "[ABE=   0, ABF=   0, ADEF=   0, AEGJ=   0, BCEF=   0, BFHJ=7053<==ON, CDE=   0, CDF=   0, "
                  "CELN=   0, DFLO=   0, EFK=   0, EJK=   0, EKL=   0, FJK=   0, FKL=   0, GHI=7053<==ON, "
                  "GIJ=   0, HIJ=4938<==ON, IJK=   0, KLM=   0, LMN=   0, LMO=   0, MNO=   0] "
                  "STARTTOUCH 0ms ActiveRegion=3");
}

TEST_F(AlgsFrames, DescribesNoNumberAsNan) {
    // With a threshold of 0 the normalized value of H is infinite, and infinity times 0 is no number.
    algs.setState("ActivationThreshold", 0.0f);
    FrameFeeder feeder(algs);
    feeder.frame(7, {{'H', 300}});
    const std::string line = algs.touchStateDescription(electrodes({{'H', 300}}), 7);
    EXPECT_EQ(line.substr(0, line.find('[')), "ts=-0.077992, sd=0.000000, tsd=nan, NonActivePixels=21, "
                                              "TimeDurationRatio=0.000000, TapSVMScore=1.549000, ");
}

// --- The debug log -------------------------------------------------------------------------------

constexpr const char *kNoEventsJson =
    R"({"Dispatched":{"numBeginHold":0,"numEndHold":0,"numHolding2Suppressed":0,"numIncrementHold":0,)"
    R"("numKeloCall":0,"numKeloCallIncrement":0,"numPlayPause":0,"numTaps":0,"numVolumeDecrement":0,)"
    R"("numVolumeDown":0,"numVolumeIncrement":0,"numVolumeUp":0},)"
    R"("Rejected":{"numRejectedBeginHold":0,"numRejectedEndHold":0,"numRejectedIncrementHold":0,)"
    R"("numRejectedKeloCall":0,"numRejectedKeloCallIncrement":0,"numRejectedPlayPause":0,"numRejectedTap":0,)"
    R"("numRejectedVolumeDecrement":0,"numRejectedVolumeDown":0,"numRejectedVolumeIncrement":0,)"
    R"("numRejectedVolumeUp":0,"numSuppressed2Holding":0}})";

constexpr const char *kIdleHead = "ts=0.000000, sd=0.000000, tsd=0.000000, NonActivePixels=21, "
                                  "TimeDurationRatio=0.000000, TapSVMScore=1.549000, ";

TEST_F(AlgsDebugLog, IsOneHandleOfTheCategoryAlgs) {
    EXPECT_EQ(logs.switches->opened, std::vector<std::string>{"org.zorva.hid.ZorvaTouch/Algs"});
}

TEST_F(AlgsDebugLog, HasThreeRecordsPerFrame) {
    logs.enable(Ports::LogLevel::Debug);
    HostEventList events;
    const Electrodes nothing{};
    algs.processTouchFrame(nothing, 57, 1000, events);
    const auto &records = logs.switches->records;
    ASSERT_EQ(records.size(), 3u);
    for (const Scripted::LogRecord &record : records)
        EXPECT_EQ(record.level, Ports::LogLevel::Debug);
    EXPECT_EQ(records[0].text, std::string("Frame 57 @1000ms, *** Event Stats ***\n") + kNoEventsJson);
    EXPECT_EQ(
        records[1].text,
        std::string("Frame 57 @1000ms, *** Touch State Description ***\n") + kIdleHead +
            "[A=   0    0, B=   0    0, C=   0    0, D=   0    0, E=   0    0, F=   0    0, G=   0    0, "
            "H=   0    0, I=   0    0, J=   0    0, K=   0    0, L=   0    0, M=   0    0, N=   0    0, "
            "O=   0    0] ");
    EXPECT_EQ(
        records[2].text,
        std::string("Frame 57 @1000ms, *** Virtual State Description ***\n") + kIdleHead +
            "[ABE=   0, ABF=   0, ADEF=   0, AEGJ=   0, BCEF=   0, BFHJ=   0, CDE=   0, CDF=   0, CELN=   0, "
            "DFLO=   0, EFK=   0, EJK=   0, EKL=   0, FJK=   0, FKL=   0, GHI=   0, GIJ=   0, HIJ=   0, "
            "IJK=   0, KLM=   0, LMN=   0, LMO=   0, MNO=   0] ");
}

TEST_F(AlgsDebugLog, PrintsNumbersAndTimesAsUnsigned) {
    logs.enable(Ports::LogLevel::Debug);
    HostEventList events;
    const Electrodes nothing{};
    algs.processTouchFrame(nothing, 4294967295, 4294967294, events);
    EXPECT_EQ(logs.switches->records.at(2).text.substr(0, 41), "Frame 4294967295 @4294967294ms, *** Virtu");
}

TEST_F(AlgsDebugLog, CountsTheFrameItReports) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 300}});
    logs.enable(Ports::LogLevel::Debug);
    feeder.frame(1020, {});
    const auto &records = logs.switches->records;
    ASSERT_EQ(records.size(), 3u);
    EXPECT_NE(records[0].text.find(R"("numTaps":1,)"), std::string::npos) << records[0].text;
    EXPECT_NE(records[1].text.find("] TAP 20ms ActiveRegion=3 BELOWNOISE"), std::string::npos)
        << records[1].text;
}

TEST_F(AlgsDebugLog, IsSilentWhenDebugLevelIsOff) {
    logs.enable(Ports::LogLevel::Default);
    logs.enable(Ports::LogLevel::Error);
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 300}});
    feeder.frame(1020, {});
    (void)algs.handleReset();
    EXPECT_TRUE(logs.switches->records.empty());
}

TEST_F(AlgsDebugLog, StopsAtOnceWhenSwitchedOffBetweenRecords) {
    for (const std::size_t count : {1u, 2u}) {
        logs.switches->records.clear();
        logs.switches->recordsUntilSilence = count;
        logs.enable(Ports::LogLevel::Debug);
        FrameFeeder(algs).frame(1000, {});
        EXPECT_EQ(logs.switches->records.size(), count);
    }
}

TEST_F(AlgsDebugLog, DoesNotChangeTheGestures) {
    logs.enable(Ports::LogLevel::Debug);
    expectGesture(algs,
                  {
                      {1000, electrodes({{'H', 500}}), "may-begin 3", "STARTTOUCH 0ms ActiveRegion=3"},
                      {1501, electrodes({{'H', 500}}), "hold-start 3", "STARTHOLD 501ms ActiveRegion=3"},
                      {1600, {}, "hold-end 3", "ENDHOLD 600ms ActiveRegion=3 BELOWNOISE"},
                  });
    EXPECT_EQ(logs.switches->records.size(), 9u);
}

} // namespace
} // namespace ZorvaTouch

#include "Shared/StateDescription.h"

#include "Shared/VirtualImage.h"
#include "Tests/Support/FramesScript.h"

#include <gtest/gtest.h>

#include <functional>
#include <limits>

namespace ZorvaTouch {
namespace {

/// What follows the list of channels; the two descriptions must agree on it.
std::string phraseOf(const HandStats &hand, std::uint32_t timeMs) {
    const std::string touch = describeTouchState(hand, makePixels(), Scripted::Electrodes{}, timeMs);
    const std::string virtualTouch = describeVirtualState(hand, makeVirtualPixels(VirtualImage()), timeMs);
    const std::string phrase = touch.substr(touch.find("] ") + 2);
    EXPECT_EQ(phrase, virtualTouch.substr(virtualTouch.find("] ") + 2));
    return phrase;
}

/// A hand whose touch began at 1000 and ended at 1250 in region 2.
HandStats touchedHand() {
    HandStats hand;
    hand.touchStartTime = 1000;
    hand.touchEndTime = 1250;
    hand.activeRegion = kPixelRegionVolumeDown;
    return hand;
}

struct PhraseCase {
    std::function<void(HandStats &)> set;
    const char *phrase; ///< at 1300 ms
};

TEST(StateDescription, TellsEveryStateOfAGesture) {
    const PhraseCase cases[] = {
        {[](HandStats &h) { h.isTouching = true; }, "STARTTOUCH 300ms ActiveRegion=2"},
        {[](HandStats &h) { h.isHolding = h.wasHolding = true; }, "HOLDING 300ms ActiveRegion=2"},
        {[](HandStats &h) { h.isHolding = true; }, "STARTHOLD 300ms ActiveRegion=2"},
        {[](HandStats &h) { h.isHoldSuppressed = true; }, "SUPPRESSHOLD 300ms ActiveRegion=2"},
        {[](HandStats &h) { h.isTouching = h.wasTouching = true; }, "TOUCHING 300ms ActiveRegion=2"},
        {[](HandStats &h) { h.wasHolding = true; }, "ENDHOLD 250ms ActiveRegion=2 BELOWNOISE"},
        {[](HandStats &h) { h.isTapCandidate = true; }, "SUPPRESSTAP 300ms ActiveRegion=2 BELOWNOISE"},
        {[](HandStats &h) { h.isTapCandidate = h.isTap = true; }, "TAP 250ms ActiveRegion=2 BELOWNOISE"},
        {[](HandStats &h) { h.isTap = true; }, "TAP 250ms ActiveRegion=2 BELOWNOISE"},
        {[](HandStats &h) { h.wasTouching = true; }, "ENDTOUCH 250ms ActiveRegion=2 BELOWNOISE"},
        {[](HandStats &) {}, ""},
    };
    for (const PhraseCase &c : cases) {
        HandStats hand = touchedHand();
        c.set(hand);
        EXPECT_EQ(phraseOf(hand, 1300), c.phrase);
    }
}

TEST(StateDescription, TheFirstStateThatAppliesIsTold) {
    // Everything is set, and is taken away in the order of the states.
    HandStats hand = touchedHand();
    hand.isTouching = hand.isHolding = hand.wasHolding = hand.isHoldSuppressed = true;
    hand.isTapCandidate = hand.isTap = hand.isAboveFloor = true;
    EXPECT_EQ(phraseOf(hand, 1300), "STARTTOUCH 300ms ActiveRegion=2");
    hand.wasTouching = true;
    EXPECT_EQ(phraseOf(hand, 1300), "HOLDING 300ms ActiveRegion=2");
    hand.wasHolding = false;
    EXPECT_EQ(phraseOf(hand, 1300), "STARTHOLD 300ms ActiveRegion=2");
    hand.isHolding = false;
    hand.wasHolding = true;
    EXPECT_EQ(phraseOf(hand, 1300), "SUPPRESSHOLD 300ms ActiveRegion=2");
    hand.isHoldSuppressed = false;
    EXPECT_EQ(phraseOf(hand, 1300), "TOUCHING 300ms ActiveRegion=2");
    hand.isTouching = false;
    EXPECT_EQ(phraseOf(hand, 1300), "ENDHOLD 250ms ActiveRegion=2 ABOVENOISE");
    hand.wasHolding = false;
    EXPECT_EQ(phraseOf(hand, 1300), "TAP 250ms ActiveRegion=2 ABOVENOISE");
    hand.isTap = false;
    EXPECT_EQ(phraseOf(hand, 1300), "SUPPRESSTAP 300ms ActiveRegion=2 ABOVENOISE");
    hand.isTapCandidate = false;
    EXPECT_EQ(phraseOf(hand, 1300), "ENDTOUCH 250ms ActiveRegion=2 ABOVENOISE");
    hand.wasTouching = false;
    EXPECT_EQ(phraseOf(hand, 1300), "") << "noise alone is idle";
}

TEST(StateDescription, DurationsAreSignedThirtyTwoBits) {
    HandStats hand = touchedHand();
    hand.isTouching = true;
    EXPECT_EQ(phraseOf(hand, 900), "STARTTOUCH -100ms ActiveRegion=2");
    EXPECT_EQ(phraseOf(hand, 2147484648u), "STARTTOUCH -2147483648ms ActiveRegion=2") << "1000 + 2^31";
    EXPECT_EQ(phraseOf(hand, 2147484647u), "STARTTOUCH 2147483647ms ActiveRegion=2");
    hand.isTouching = false;
    hand.isTap = true;
    hand.touchEndTime = 0;
    EXPECT_EQ(phraseOf(hand, 5), "TAP -1000ms ActiveRegion=2 BELOWNOISE");
}

TEST(StateDescription, ActiveRegionIsItsCode) {
    HandStats hand;
    hand.isTouching = true;
    EXPECT_EQ(phraseOf(hand, 0), "STARTTOUCH 0ms ActiveRegion=0");
    hand.activeRegion = kPixelRegionVolumeUp;
    EXPECT_EQ(phraseOf(hand, 0), "STARTTOUCH 0ms ActiveRegion=3");
}

TEST(StateDescription, TheHeadHasTheMeasuresInThePrintedOrder) {
    HandStats hand;
    hand.touchScore = 1.5f;
    hand.strengthDurationRatio = -2.25f;
    hand.touchStrengthDurationRatio = 0.1f; // 0.100000001490116, six decimals of it
    hand.nonActivePixels = -17;
    hand.timeDurationRatio = 1000000.0f;
    hand.tapSvmScore = -0.0000004f;
    EXPECT_EQ(
        describeTouchState(hand, makePixels(), Scripted::Electrodes{}, 0),
        "ts=1.500000, sd=-2.250000, tsd=0.100000, NonActivePixels=-17, TimeDurationRatio=1000000.000000, "
        "TapSVMScore=-0.000000, [A=   0    0, B=   0    0, C=   0    0, D=   0    0, E=   0    0, F=   0    "
        "0, "
        "G=   0    0, H=   0    0, I=   0    0, J=   0    0, K=   0    0, L=   0    0, M=   0    0, "
        "N=   0    0, O=   0    0] ");
}

TEST(StateDescription, TheHeadHoldsNumbersOfEverySize) {
    HandStats hand;
    hand.touchScore = std::numeric_limits<float>::quiet_NaN();
    hand.strengthDurationRatio = -std::numeric_limits<float>::quiet_NaN();
    hand.touchStrengthDurationRatio = std::numeric_limits<float>::infinity();
    hand.nonActivePixels = std::numeric_limits<std::int32_t>::min();
    hand.timeDurationRatio = -std::numeric_limits<float>::infinity();
    hand.tapSvmScore = 16777216.0f;
    const std::string line = describeVirtualState(hand, makeVirtualPixels(VirtualImage()), 0);
    EXPECT_EQ(line.substr(0, line.find('[')), "ts=nan, sd=nan, tsd=inf, NonActivePixels=-2147483648, "
                                              "TimeDurationRatio=-inf, TapSVMScore=16777216.000000, ");
    hand.tapSvmScore = std::numeric_limits<float>::max(); // 2^128 - 2^104, exactly
    const std::string longLine = describeVirtualState(hand, makeVirtualPixels(VirtualImage()), 0);
    EXPECT_NE(longLine.find("TapSVMScore=340282346638528859811704183484516925440.000000, ["),
              std::string::npos)
        << longLine;
}

TEST(StateDescription, ElectrodesShowInputValueAndTouch) {
    Pixels pixels = makePixels();
    Scripted::Electrodes values{};
    values[0] = 7;
    pixels[0].value = 13;
    values[1] = -32768;
    pixels[1].value = -61711;
    values[2] = 1234;
    pixels[2].value = 9999;
    pixels[2].isTouched = true;
    values[3] = 32767;
    pixels[3].value = 2147483647;
    pixels[3].isTouched = true;
    pixels[4].isTouched = true;
    pixels[14].isTouched = true;
    pixels[14].value = -1;
    EXPECT_EQ(
        describeTouchState(HandStats(), pixels, values, 0),
        "ts=0.000000, sd=0.000000, tsd=0.000000, NonActivePixels=0, TimeDurationRatio=0.000000, "
        "TapSVMScore=0.000000, [A=   7   13, B=-32768 -61711, C=1234 9999<==ON, D=32767 2147483647<==ON, "
        "E=   0    0<==ON, F=   0    0, G=   0    0, H=   0    0, I=   0    0, J=   0    0, K=   0    0, "
        "L=   0    0, M=   0    0, N=   0    0, O=   0   -1<==ON] ");
}

TEST(StateDescription, VirtualPixelsShowValueAndTouch) {
    VirtualPixels pixels = makeVirtualPixels(VirtualImage());
    for (std::size_t i = 0; i < pixels.size(); ++i)
        pixels[i].value = static_cast<std::int32_t>(i);
    pixels[0].value = -21846;
    pixels[5].isTouched = true;
    pixels[22].isTouched = true;
    pixels[22].value = 12345;
    EXPECT_EQ(describeVirtualState(HandStats(), pixels, 0),
              "ts=0.000000, sd=0.000000, tsd=0.000000, NonActivePixels=0, TimeDurationRatio=0.000000, "
              "TapSVMScore=0.000000, [ABE=-21846, ABF=   1, ADEF=   2, AEGJ=   3, BCEF=   4, BFHJ=   5<==ON, "
              "CDE=   6, CDF=   7, CELN=   8, DFLO=   9, EFK=  10, EJK=  11, EKL=  12, FJK=  13, FKL=  14, "
              "GHI=  15, GIJ=  16, HIJ=  17, IJK=  18, KLM=  19, LMN=  20, LMO=  21, MNO=12345<==ON] ");
}

TEST(StateDescription, ALetterIsItsPixelsIndex) {
    Pixels pixels = makePixels();
    pixels[0].index = 3;
    const std::string line = describeTouchState(HandStats(), pixels, Scripted::Electrodes{}, 0);
    EXPECT_NE(line.find("[D=   0    0, B="), std::string::npos) << line;
}

} // namespace
} // namespace ZorvaTouch

#include "Shared/Pixel.h"

#include <cmath>
#include <limits>
#include <string>
#include <vector>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

constexpr float kInfinity = std::numeric_limits<float>::infinity();
constexpr float kNan = std::numeric_limits<float>::quiet_NaN();
constexpr std::int32_t kLargest = std::numeric_limits<std::int32_t>::max();
constexpr std::int32_t kSmallest = std::numeric_limits<std::int32_t>::min();

/// A channel that takes its input as it is.
Pixel plainPixel() { return Pixel(0, 1.0f); }

std::int32_t valueOf(float gain, std::int32_t raw) {
    Pixel pixel(0, gain);
    pixel.updatePixelState(raw, 200.0f);
    return pixel.value;
}

/// One frame of a channel with gain 1 and activation threshold 100: the normalized value is a hundredth of
/// the raw one.
struct FrameRow {
    std::int32_t raw;
    bool isTouched;
    float peakValue, valleyValue;
};

void expectFrames(Pixel pixel, const std::vector<FrameRow> &rows) {
    for (std::size_t i = 0; i < rows.size(); ++i) {
        SCOPED_TRACE("frame " + std::to_string(i) + ", raw " + std::to_string(rows[i].raw));
        pixel.updatePixelState(rows[i].raw, 100.0f);
        EXPECT_EQ(pixel.isTouched, rows[i].isTouched);
        EXPECT_EQ(pixel.peakValue, rows[i].peakValue);
        EXPECT_EQ(pixel.valleyValue, rows[i].valleyValue);
    }
}

TEST(Pixel, StartsUntouchedAndAtRest) {
    const Pixel pixel(7, 1.25f);
    EXPECT_EQ(pixel.index, 7);
    EXPECT_EQ(pixel.gain, 1.25f);
    EXPECT_EQ(pixel.value, 0);
    EXPECT_EQ(pixel.normalizedValue, 0.0f);
    EXPECT_EQ(pixel.peakValue, 0.0f);
    EXPECT_EQ(pixel.valleyValue, 0.0f);
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_FALSE(pixel.isAboveFloor);
    EXPECT_FALSE(pixel.wasAboveFloor);
    EXPECT_FALSE(pixel.wasTouched);
    EXPECT_EQ(pixel.maxNormalizedValue, 0.0f);
}

TEST(Pixel, ElectrodesHaveTheirIndexAndGain) {
    const Pixels pixels = makePixels();
    const std::vector<float> gains{1.9219f, 1.8833f, 1.9281f, 1.8837f, 1.9163f, 1.8105f, 1.0081f, 1.0f,
                                   1.4851f, 1.5033f, 2.4154f, 1.5378f, 1.5431f, 1.04f,   1.0493f};
    ASSERT_EQ(pixels.size(), gains.size());
    for (std::size_t i = 0; i < gains.size(); ++i) {
        EXPECT_EQ(pixels[i].index, static_cast<std::int32_t>(i));
        EXPECT_EQ(pixels[i].gain, gains[i]) << "electrode " << i;
    }
}

TEST(PixelRegion, FollowsFromTheElectrode) {
    // A to F and K play/pause, G to J volume up, L to O volume down.
    const std::vector<PixelRegion> regions{
        kPixelRegionPlayPause,  kPixelRegionPlayPause,  kPixelRegionPlayPause,   // A B C
        kPixelRegionPlayPause,  kPixelRegionPlayPause,  kPixelRegionPlayPause,   // D E F
        kPixelRegionVolumeUp,   kPixelRegionVolumeUp,   kPixelRegionVolumeUp,    // G H I
        kPixelRegionVolumeUp,   kPixelRegionPlayPause,  kPixelRegionVolumeDown,  // J K L
        kPixelRegionVolumeDown, kPixelRegionVolumeDown, kPixelRegionVolumeDown}; // M N O
    for (std::size_t i = 0; i < regions.size(); ++i)
        EXPECT_EQ(Pixel(static_cast<std::int32_t>(i), 1.0f).getPixelRegion(), regions[i])
            << "electrode " << i;
}

TEST(PixelRegion, CodesAreTheOnesOfTheEvents) {
    EXPECT_EQ(static_cast<std::uint32_t>(kPixelRegionNone), 0u);
    EXPECT_EQ(static_cast<std::uint32_t>(kPixelRegionPlayPause), 1u);
    EXPECT_EQ(static_cast<std::uint32_t>(kPixelRegionVolumeDown), 2u);
    EXPECT_EQ(static_cast<std::uint32_t>(kPixelRegionVolumeUp), 3u);
}

TEST(PixelRegion, OtherIndicesHaveNone) {
    for (const std::int32_t index : {15, 16, 20, 30, 31, 47, 63, -1, -17})
        EXPECT_EQ(regionOfElectrode(index), kPixelRegionNone) << index;
}

TEST(PixelRegion, OnlyTheLowFiveBitsOfTheIndexCount) {
    EXPECT_EQ(regionOfElectrode(32), kPixelRegionPlayPause);        // as 0
    EXPECT_EQ(regionOfElectrode(65), kPixelRegionPlayPause);        // as 1; the code of 'A'
    EXPECT_EQ(regionOfElectrode(71), kPixelRegionVolumeUp);         // as 7; the code of 'G'
    EXPECT_EQ(regionOfElectrode(43), kPixelRegionVolumeDown);       // as 11
    EXPECT_EQ(regionOfElectrode(-26), kPixelRegionVolumeUp);        // as 6
    EXPECT_EQ(regionOfElectrode(kSmallest), kPixelRegionPlayPause); // as 0
}

TEST(Pixel, ValueIsTheGainedInputTruncatedTowardZero) {
    EXPECT_EQ(valueOf(0.5f, 3), 1);
    EXPECT_EQ(valueOf(0.5f, -3), -1); // -1.5
    EXPECT_EQ(valueOf(0.5f, 1), 0);
    EXPECT_EQ(valueOf(0.5f, -1), 0);
    EXPECT_EQ(valueOf(1.9219f, 100), 192);
    EXPECT_EQ(valueOf(1.9219f, -100), -192);
    EXPECT_EQ(valueOf(2.4154f, 32767), 79145); // 79145.4
    EXPECT_EQ(valueOf(1.0f, -32768), -32768);
    EXPECT_EQ(valueOf(-2.0f, 3), -6);
}

TEST(Pixel, GainIsAppliedInSinglePrecision) {
    // 1.8833f is a little below 1.8833 (1.88329994...), times 10000 lies between the floats 18832.998 and
    // 18833 and rounds up; a product in double precision would truncate to 18832. Likewise 2.4154f * 7961 =
    // 19228.9994.
    EXPECT_EQ(valueOf(1.8833f, 10000), 18833);
    EXPECT_EQ(valueOf(2.4154f, 7961), 19229);
    EXPECT_EQ(valueOf(1.0f, 16777217), 16777216); // the input is a float before it is multiplied
}

TEST(Pixel, ValueSaturates) {
    EXPECT_EQ(valueOf(2.0f, kLargest), kLargest);
    EXPECT_EQ(valueOf(1.0f, kLargest), kLargest); // rounds to 2^31 first
    EXPECT_EQ(valueOf(2.0f, kSmallest), kSmallest);
    EXPECT_EQ(valueOf(kInfinity, 1), kLargest);
    EXPECT_EQ(valueOf(kInfinity, -1), kSmallest);
}

TEST(Pixel, ValueOfANanIsZero) {
    EXPECT_EQ(valueOf(kNan, 1000), 0);
    EXPECT_EQ(valueOf(kInfinity, 0), 0);
}

TEST(Pixel, NormalizedValueIsInUnitsOfTheActivationThreshold) {
    Pixel pixel(0, 2.0f);
    pixel.updatePixelState(75, 200.0f);
    EXPECT_EQ(pixel.normalizedValue, 0.75f);
    pixel.updatePixelState(-75, 200.0f);
    EXPECT_EQ(pixel.normalizedValue, -0.75f);
    pixel.updatePixelState(75, 50.0f);
    EXPECT_EQ(pixel.normalizedValue, 3.0f);
    // Of the truncated value, not of the product.
    Pixel half(0, 0.5f);
    half.updatePixelState(3, 2.0f);
    EXPECT_EQ(half.normalizedValue, 0.5f);
}

TEST(Pixel, EntersAboveTheActivationThresholdAndNotAtIt) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(200, 200.0f);
    EXPECT_FALSE(pixel.isTouched);
    pixel.updatePixelState(201, 200.0f);
    EXPECT_TRUE(pixel.isTouched);
}

TEST(Pixel, EntersOnTheFirstFrame) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(201, 200.0f);
    EXPECT_TRUE(pixel.isTouched);
}

TEST(Pixel, IsReleasedAtSixtyPercentOfThePeak) {
    expectFrames(plainPixel(), {{150, true, 1.5f, 1.5f},
                                {200, true, 2.0f, 2.0f},
                                {121, true, 2.0f, 1.21f},
                                {120, false, 1.2f, 1.2f}}); // 0.6 * 2.0 = 1.2: equal is not above
}

TEST(Pixel, StaysTouchedBelowTheActivationThreshold) {
    expectFrames(plainPixel(),
                 {{101, true, 1.01f, 1.01f}, {62, true, 1.01f, 0.62f}, {60, false, 0.6f, 0.6f}});
}

TEST(Pixel, PeakGrowsOnlyUpwardWhileTouched) {
    expectFrames(plainPixel(), {{200, true, 2.0f, 2.0f},
                                {150, true, 2.0f, 1.5f},
                                {300, true, 3.0f, 3.0f},
                                {250, true, 3.0f, 2.5f},
                                {181, true, 3.0f, 1.81f},
                                {180, false, 1.8f, 1.8f}});
}

TEST(Pixel, ReleaseIsComparedWithThePeakOfTheFramesBefore) {
    // The jump from 2.0 to 10.0 is measured against 1.2, and only the next frame against 6.0.
    expectFrames(plainPixel(),
                 {{200, true, 2.0f, 2.0f}, {1000, true, 10.0f, 10.0f}, {600, false, 6.0f, 6.0f}});
}

TEST(Pixel, AfterAHighReleaseItMustRiseFromItsLowestValue) {
    // 1.2 / 0.6 = 2.0: although 1.2 to 2.0 are above the activation threshold, only more than 2.0 enters.
    expectFrames(plainPixel(), {{200, true, 2.0f, 2.0f},
                                {120, false, 1.2f, 1.2f},
                                {150, false, 1.5f, 1.2f},
                                {200, false, 2.0f, 1.2f},
                                {201, true, 2.01f, 2.01f}});
}

TEST(Pixel, LowestValueRunsDownwardWhileNotTouched) {
    // After 0.9 the way up ends at 0.9 / 0.6 = 1.5.
    expectFrames(plainPixel(), {{200, true, 2.0f, 2.0f},
                                {120, false, 1.2f, 1.2f},
                                {90, false, 0.9f, 0.9f},
                                {110, false, 1.1f, 0.9f},
                                {149, false, 1.49f, 0.9f},
                                {151, true, 1.51f, 1.51f}});
}

TEST(Pixel, FromALowLevelOnlyTheActivationThresholdCounts) {
    // 0.3 / 0.6 = 0.5 is less than 1.
    expectFrames(plainPixel(), {{200, true, 2.0f, 2.0f},
                                {30, false, 0.3f, 0.3f},
                                {100, false, 1.0f, 0.3f},
                                {101, true, 1.01f, 1.01f}});
}

TEST(Pixel, NegativeValuesLowerTheLowestValue) {
    expectFrames(plainPixel(),
                 {{-50, false, -0.5f, -0.5f}, {0, false, 0.0f, -0.5f}, {101, true, 1.01f, 1.01f}});
}

TEST(Pixel, FirstTouchedFrameKeepsAHigherPeak) {
    Pixel pixel = plainPixel();
    pixel.peakValue = 5.0f; // as the frame before left it
    pixel.updatePixelState(200, 100.0f);
    EXPECT_TRUE(pixel.isTouched);
    EXPECT_EQ(pixel.peakValue, 5.0f);
}

TEST(Pixel, FirstUntouchedFrameKeepsALowerValley) {
    Pixel pixel = plainPixel();
    pixel.isTouched = true;
    pixel.peakValue = 10.0f;
    pixel.valleyValue = 0.5f; // as the touched frame before left it
    pixel.updatePixelState(200, 100.0f);
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_EQ(pixel.peakValue, 2.0f);
    EXPECT_EQ(pixel.valleyValue, 0.5f);
}

// The ratio is the float 0.6, which is a little above 0.6; with the double 0.6 both channels would stay as
// they were.
TEST(Pixel, ReleaseRatioIsSinglePrecision) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(285, 200.0f); // 1.425, and 1.425f * 0.6f = 0.855000019 = 171.0f / 200
    ASSERT_TRUE(pixel.isTouched);
    pixel.updatePixelState(171, 200.0f);
    EXPECT_FALSE(pixel.isTouched);
}

TEST(Pixel, EntryRatioIsSinglePrecision) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(300, 200.0f);
    pixel.updatePixelState(159, 200.0f); // released at 0.795; 0.795f / 0.6f = 1.32499993
    ASSERT_FALSE(pixel.isTouched);
    pixel.updatePixelState(265, 200.0f); // 1.32500005
    EXPECT_TRUE(pixel.isTouched);
}

struct FloorRow {
    std::int32_t raw;
    bool isAboveFloor, wasAboveFloor;
    float maxNormalizedValue;
};

// Activation threshold 10, so that the noise floor is far above it: the two have nothing to do with each
// other.
TEST(Pixel, FloorIsBetween75And76) {
    Pixel pixel = plainPixel();
    const std::vector<FloorRow> rows{
        {75, false, false, 0.0f},  // normalized 7.5, but not above the floor: no maximum
        {76, true, true, 7.6f},    //
        {75, false, true, 7.6f},   // the flag of the frame falls, the sticky ones stay
        {500, true, true, 50.0f},  //
        {499, true, true, 50.0f},  // a smaller value is no new maximum
        {0, false, true, 50.0f},   //
        {-500, false, true, 50.0f} //
    };
    for (const FloorRow &row : rows) {
        SCOPED_TRACE(row.raw);
        pixel.updatePixelState(row.raw, 10.0f);
        EXPECT_EQ(pixel.isAboveFloor, row.isAboveFloor);
        EXPECT_EQ(pixel.wasAboveFloor, row.wasAboveFloor);
        EXPECT_EQ(pixel.maxNormalizedValue, row.maxNormalizedValue);
    }
}

TEST(Pixel, FloorIsMeasuredOnTheGainedValue) {
    Pixel pixel(0, 0.5f);
    pixel.updatePixelState(151, 200.0f); // 75.5 truncates to 75
    EXPECT_FALSE(pixel.isAboveFloor);
    EXPECT_FALSE(pixel.wasAboveFloor);
    pixel.updatePixelState(152, 200.0f);
    EXPECT_TRUE(pixel.isAboveFloor);
    EXPECT_TRUE(pixel.wasAboveFloor);
}

TEST(Pixel, HavingBeenTouchedIsRememberedAfterTheRelease) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(199, 200.0f);
    EXPECT_FALSE(pixel.wasTouched);
    pixel.updatePixelState(300, 200.0f);
    EXPECT_TRUE(pixel.wasTouched);
    pixel.updatePixelState(0, 200.0f);
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_TRUE(pixel.wasTouched);
}

TEST(Pixel, ATouchBelowTheFloorLeavesNoMaximum) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(50, 10.0f);
    EXPECT_TRUE(pixel.isTouched);
    EXPECT_TRUE(pixel.wasTouched);
    EXPECT_FALSE(pixel.wasAboveFloor);
    EXPECT_EQ(pixel.maxNormalizedValue, 0.0f);
}

TEST(Pixel, ResetOfTheStatisticsTouchesNothingElse) {
    Pixel pixel(3, 2.0f);
    pixel.updatePixelState(200, 200.0f); // 400, normalized 2.0
    pixel.updatePixelState(150, 200.0f); // 300, normalized 1.5
    pixel.resetGlobalStats();
    EXPECT_FALSE(pixel.wasAboveFloor);
    EXPECT_FALSE(pixel.wasTouched);
    EXPECT_EQ(pixel.maxNormalizedValue, 0.0f);

    EXPECT_TRUE(pixel.isTouched);
    EXPECT_TRUE(pixel.isAboveFloor);
    EXPECT_EQ(pixel.value, 300);
    EXPECT_EQ(pixel.normalizedValue, 1.5f);
    EXPECT_EQ(pixel.peakValue, 2.0f);
    EXPECT_EQ(pixel.valleyValue, 1.5f);
    EXPECT_EQ(pixel.gain, 2.0f);
    EXPECT_EQ(pixel.index, 3);
}

TEST(Pixel, StatisticsBeginAgainAfterTheirReset) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(400, 200.0f);
    pixel.resetGlobalStats();
    pixel.updatePixelState(300, 200.0f);
    EXPECT_TRUE(pixel.wasAboveFloor);
    EXPECT_TRUE(pixel.wasTouched);
    EXPECT_EQ(pixel.maxNormalizedValue, 1.5f);
}

// A threshold of 0 makes every value infinite and 0 a NaN, which compares false everywhere.
TEST(Pixel, ZeroThresholdMakesInfinitiesAndNans) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(0, 0.0f);
    EXPECT_TRUE(std::isnan(pixel.normalizedValue));
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_TRUE(std::isnan(pixel.peakValue));
    EXPECT_EQ(pixel.valleyValue, 0.0f); // a NaN is not smaller

    pixel = plainPixel();
    pixel.updatePixelState(100, 0.0f);
    EXPECT_EQ(pixel.normalizedValue, kInfinity);
    EXPECT_TRUE(pixel.isTouched);
    EXPECT_EQ(pixel.peakValue, kInfinity);
    EXPECT_EQ(pixel.valleyValue, kInfinity);
    EXPECT_EQ(pixel.maxNormalizedValue, kInfinity);
    pixel.updatePixelState(100, 0.0f); // infinity is not above 0.6 of infinity
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_EQ(pixel.peakValue, kInfinity);
    EXPECT_EQ(pixel.valleyValue, kInfinity);

    pixel = plainPixel();
    pixel.updatePixelState(-100, 0.0f);
    EXPECT_EQ(pixel.normalizedValue, -kInfinity);
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_EQ(pixel.valleyValue, -kInfinity);
    pixel.updatePixelState(101, 100.0f); // from there only the activation threshold counts
    EXPECT_TRUE(pixel.isTouched);
}

TEST(Pixel, ANanReleasesTheChannel) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(200, 100.0f);
    ASSERT_TRUE(pixel.isTouched);
    pixel.updatePixelState(0, 0.0f);
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_TRUE(std::isnan(pixel.peakValue));
    EXPECT_EQ(pixel.valleyValue, 2.0f);
}

TEST(Pixel, ANanLeftAsPeakReleasesTheNextTouchAfterOneFrame) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(0, 0.0f);
    pixel.updatePixelState(200, 100.0f); // entered over the valley of 0; 2.0 is not greater than the NaN
    EXPECT_TRUE(pixel.isTouched);
    EXPECT_TRUE(std::isnan(pixel.peakValue));
    pixel.updatePixelState(200, 100.0f); // nothing is above a NaN
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_EQ(pixel.peakValue, 2.0f);
}

TEST(Pixel, NanAndInfiniteThresholdsNeverTouch) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(1000, kNan);
    EXPECT_TRUE(std::isnan(pixel.normalizedValue));
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_TRUE(pixel.isAboveFloor); // the floor does not depend on the threshold
    EXPECT_TRUE(pixel.wasAboveFloor);
    EXPECT_EQ(pixel.maxNormalizedValue, 0.0f); // a NaN is not greater

    pixel = plainPixel();
    pixel.updatePixelState(1000, kInfinity);
    EXPECT_EQ(pixel.normalizedValue, 0.0f);
    EXPECT_FALSE(pixel.isTouched);
}

TEST(Pixel, NegativeThresholdTurnsTheSigns) {
    Pixel pixel = plainPixel();
    pixel.updatePixelState(-300, -200.0f);
    EXPECT_EQ(pixel.normalizedValue, 1.5f);
    EXPECT_TRUE(pixel.isTouched);
    EXPECT_FALSE(pixel.isAboveFloor);
    pixel.updatePixelState(300, -200.0f);
    EXPECT_EQ(pixel.normalizedValue, -1.5f);
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_TRUE(pixel.isAboveFloor);
    EXPECT_TRUE(pixel.wasAboveFloor);
    EXPECT_EQ(pixel.maxNormalizedValue, 0.0f); // -1.5 is not greater than 0
}

TEST(Pixel, AnEqualValueReplacesNothing) {
    // -0 and 0 are equal, and their sign tells them apart.
    Pixel pixel = plainPixel();
    pixel.updatePixelState(0, -200.0f);
    EXPECT_TRUE(std::signbit(pixel.normalizedValue));
    EXPECT_FALSE(std::signbit(pixel.valleyValue));
    pixel.updatePixelState(100, -kInfinity);
    EXPECT_TRUE(std::signbit(pixel.normalizedValue));
    EXPECT_TRUE(pixel.wasAboveFloor);
    EXPECT_FALSE(std::signbit(pixel.maxNormalizedValue));
}

TEST(VirtualPixel, IndexIsTheCharacterCodeOfItsFirstLetterUntilTheFirstFrame) {
    const VirtualPixel adef("ADEF", 0.6667f);
    EXPECT_EQ(adef.index, 65); // 'A', not electrode 0: meant, and overwritten by the first frame
    EXPECT_EQ(adef.name, "ADEF");
    EXPECT_EQ(adef.gain, 0.6667f);
    EXPECT_EQ(adef.value, 0);
    EXPECT_EQ(adef.normalizedValue, 0.0f);
    EXPECT_FALSE(adef.isTouched);
    EXPECT_EQ(VirtualPixel("MNO", 1.0f).index, 77);
}

TEST(VirtualPixel, TakesItsSumAndThenItsDominantElectrode) {
    VirtualPixel pixel("GHI", 0.5f);
    pixel.updatePixelState(600, 200.0f, 8);
    EXPECT_EQ(pixel.value, 300);
    EXPECT_EQ(pixel.normalizedValue, 1.5f);
    EXPECT_TRUE(pixel.isTouched);
    EXPECT_TRUE(pixel.wasAboveFloor);
    EXPECT_EQ(pixel.index, 8);
    EXPECT_EQ(pixel.getPixelRegion(), kPixelRegionVolumeUp);
    pixel.updatePixelState(0, 200.0f, 12);
    EXPECT_FALSE(pixel.isTouched);
    EXPECT_EQ(pixel.index, 12);
    EXPECT_EQ(pixel.getPixelRegion(), kPixelRegionVolumeDown);
}

TEST(VirtualPixel, TakesAValueAlone) {
    VirtualPixel pixel("GHI", 0.5f);
    pixel.updatePixelState(600, 200.0f, 7);
    pixel.updatePixelState(800, 200.0f);
    EXPECT_EQ(pixel.value, 400);
    EXPECT_EQ(pixel.normalizedValue, 2.0f);
    EXPECT_EQ(pixel.index, 7) << "stays";
}

TEST(VirtualPixel, KeepsANameThatWasMadeAtRunTime) {
    for (const char *name : {"GHI", "ABCDEFGHIJKLMNO with more than a short string"}) {
        std::string letters = name;
        const VirtualPixel pixel(letters, 1.0f);
        letters.assign(letters.size(), 'Z');
        EXPECT_EQ(pixel.name, name);
    }
}

TEST(VirtualPixel, SumsBeyondSixteenBitsAreTaken) {
    VirtualPixel pixel("ABE", 1.0f);
    pixel.updatePixelState(196608, 200.0f, 0); // the width of the sum is 32 bits here
    EXPECT_EQ(pixel.value, 196608);
}

} // namespace
} // namespace ZorvaTouch

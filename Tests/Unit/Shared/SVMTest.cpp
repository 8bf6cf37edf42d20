#include "Shared/SVM.h"

#include "Tests/Support/Channels.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <vector>

#include <gtest/gtest.h>

// The expected scores were worked out apart from this code, with each subtraction, division, product and sum
// rounded to single precision, rank 0 first and the constant term last. The same sums from rank 37 down, or
// in double precision, differ in the last digits shown.

namespace ZorvaTouch {
namespace {

using Testing::Channels;

/// The score of these values, dealt to the channels in order from electrode A to group "MNO"; the rest are 0.
float scoreOf(const std::vector<std::int32_t> &values, float activationThreshold = 200.0f) {
    Channels channels;
    for (std::size_t i = 0; i < values.size(); ++i)
        (i < 15 ? channels.pixels[i] : channels.virtualPixels.at(i - 15)).value = values[i];
    SVM svm;
    svm.updateSVMScore(channels.pixels, channels.virtualPixels, activationThreshold, 0);
    EXPECT_EQ(svm.getSVMScore(), svm.score);
    return svm.score;
}

/// 38 values from `first` on, each `step` less than the one before.
std::vector<std::int32_t> stairs(std::int32_t first, std::int32_t step) {
    std::vector<std::int32_t> values(38);
    for (std::size_t i = 0; i < values.size(); ++i)
        values[i] = static_cast<std::int32_t>(first - static_cast<std::int64_t>(i) * step);
    return values;
}

/// The table's entries in ten-thousandths, each times its rank plus one: no single entry can change
/// unnoticed.
std::int64_t weightedSum(const std::array<float, 38> &table) {
    std::int64_t sum = 0;
    for (std::size_t i = 0; i < table.size(); ++i)
        sum += static_cast<std::int64_t>(i + 1) * std::llround(static_cast<double>(table[i]) * 10000.0);
    return sum;
}

TEST(SVM, StartsWithItsModel) {
    const SVM svm;
    EXPECT_EQ(svm.score, 0.0f);
    EXPECT_EQ(svm.bias, 2.0083f);
    EXPECT_EQ(svm.means[0], 559.2485f);
    EXPECT_EQ(svm.scales[0], 319.631f);
    EXPECT_EQ(svm.weights[0], 2.0791f);
    EXPECT_EQ(svm.weights[2], -0.0003f);
    EXPECT_EQ(svm.means[18], 104.0568f);
    EXPECT_EQ(svm.scales[18], 116.673f);
    EXPECT_EQ(svm.weights[18], -0.95f);
    EXPECT_EQ(svm.means[37], 2.1581f);
    EXPECT_EQ(svm.scales[37], 10.0508f);
    EXPECT_EQ(svm.weights[37], -0.2101f);
}

TEST(SVM, TablesAddUp) {
    const SVM svm;
    EXPECT_EQ(weightedSum(svm.means), 518579411);
    EXPECT_EQ(weightedSum(svm.scales), 553196213);
    EXPECT_EQ(weightedSum(svm.weights), -1118657);
}

TEST(SVM, NothingScoresZeroWithoutTheBias) { EXPECT_EQ(scoreOf({}), 0.0f); }

TEST(SVM, OneChannelMustExceedTheActivationThreshold) {
    EXPECT_EQ(scoreOf({200}), 0.0f);
    EXPECT_EQ(scoreOf({201}), -2.06483674f);
    EXPECT_EQ(scoreOf({200}, 199.5f), -2.07134175f);
}

TEST(SVM, OrTwoChannelsMustBeAboveTheFloor) {
    EXPECT_EQ(scoreOf({76, 75}), 0.0f);
    EXPECT_EQ(scoreOf({200, 75}), 0.0f);
    EXPECT_EQ(scoreOf({76, 76}), -2.71197248f);
    EXPECT_EQ(scoreOf({75, 75, 75}), 0.0f);
}

TEST(SVM, EitherConditionIsEnough) {
    EXPECT_EQ(scoreOf({300}), -1.42087269f);
    EXPECT_EQ(scoreOf({300, 75}), -1.25710583f);
    EXPECT_EQ(scoreOf({300, 76}), -1.25492191f);
}

TEST(SVM, SumsAllRanks) {
    EXPECT_EQ(scoreOf(stairs(380, 10)), -5.06941986f);
    EXPECT_EQ(scoreOf(stairs(1000, 30)), 4.81812859f);
    EXPECT_EQ(scoreOf(stairs(1013, 37)), 27.6322823f); // the last ranks are negative
}

TEST(SVM, NegativeValuesRankBelowZero) {
    std::vector<std::int32_t> values(38, -50);
    values[20] = 400;
    values[30] = 500;
    EXPECT_EQ(scoreOf(values), 5.93140507f);
}

TEST(SVM, DependsOnTheRanksAndNotOnTheChannels) {
    std::vector<std::int32_t> values = stairs(1013, 37);
    std::reverse(values.begin(), values.end());
    EXPECT_EQ(scoreOf(values), 27.6322823f);
    std::rotate(values.begin(), values.begin() + 17, values.end());
    EXPECT_EQ(scoreOf(values), 27.6322823f);
}

TEST(SVM, EqualValuesScoreTheSameWhereverTheyAre) {
    std::vector<std::int32_t> values(38);
    values[9] = values[33] = 76;
    EXPECT_EQ(scoreOf(values), -2.71197248f);
}

TEST(SVM, LargestValuesStayFinite) {
    std::vector<std::int32_t> values(38, 32767);
    values[37] = std::numeric_limits<std::int32_t>::max();
    EXPECT_EQ(scoreOf(values), 13965384.0f);
}

// Only factors far out of proportion lead to such values; they are ranked as all others are.
TEST(SVM, RanksValuesOfEveryMagnitude) {
    std::vector<std::int32_t> wide = stairs(1900000000, 100000000);
    std::reverse(wide.begin(), wide.end());
    std::rotate(wide.begin(), wide.begin() + 11, wide.end());
    EXPECT_EQ(scoreOf(wide), 163281904.0f);

    // On both sides of plus and minus 2^25.
    std::vector<std::int32_t> values{-33554433, 33554429, -33554431, 33554431, -33554429,
                                     33554433,  33554430, -33554430, 33554432, -33554432};
    for (std::int32_t i = 0; i < 28; ++i)
        values.push_back(33000000 - i * 1000000);
    EXPECT_EQ(scoreOf(values), 1961178.0f);
}

TEST(SVM, RanksNeighbouringValues) {
    // Every step between two values is the least there is.
    std::vector<std::int32_t> values = stairs(90, 1);
    std::rotate(values.begin(), values.begin() + 23, values.end());
    EXPECT_EQ(scoreOf(values), -8.47524261f);
    std::swap(values[3], values[29]);
    EXPECT_EQ(scoreOf(values), -8.47524261f);
}

TEST(SVM, GateComparesTheValueAsAFloat) {
    EXPECT_EQ(scoreOf({16777217}, 16777216.0f), 0.0f); // 2^24 + 1 rounds to 2^24, which is not greater
    EXPECT_NE(scoreOf({16777218}, 16777216.0f), 0.0f);
}

TEST(SVM, ZeroAndNegativeThresholds) {
    EXPECT_EQ(scoreOf({}, 0.0f), 0.0f);
    EXPECT_EQ(scoreOf({}, -1.0f), -3.37227941f); // 0 exceeds it: every mean counts
}

TEST(SVM, NanAndInfiniteThresholdsLeaveTheFloor) {
    for (const float threshold :
         {std::numeric_limits<float>::quiet_NaN(), std::numeric_limits<float>::infinity()}) {
        EXPECT_EQ(scoreOf({1000}, threshold), 0.0f);
        EXPECT_EQ(scoreOf({76, 76}, threshold), -2.71197248f);
    }
}

TEST(SVM, ScoreIsOfTheLastFrameOnly) {
    Channels channels;
    SVM svm;
    channels.electrode('A').value = 201;
    svm.updateSVMScore(channels.pixels, channels.virtualPixels, 200.0f, 0);
    svm.updateSVMScore(channels.pixels, channels.virtualPixels, 200.0f, 1);
    EXPECT_EQ(svm.score, -2.06483674f);
    svm.updateSVMScore(Channels().pixels, Channels().virtualPixels, 200.0f, 2);
    EXPECT_EQ(svm.score, 0.0f);
}

TEST(SVM, LooksAtValuesAndNothingElse) {
    Channels channels;
    for (Pixel &pixel : channels.pixels) {
        pixel.normalizedValue = 5.0f;
        pixel.isTouched = pixel.isAboveFloor = true;
    }
    SVM svm;
    svm.updateSVMScore(channels.pixels, channels.virtualPixels, 200.0f, 4294967295u);
    EXPECT_EQ(svm.score, 0.0f);
}

} // namespace
} // namespace ZorvaTouch

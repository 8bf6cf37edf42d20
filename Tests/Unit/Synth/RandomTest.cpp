#include "Synth/Random.h"

#include <gtest/gtest.h>

#include <cmath>

namespace ZorvaTouch::Synth {
namespace {

TEST(SynthRandom, DrawsThePublishedNumbers) {
    Random random(1234567); // the generator's well-known test sequence
    EXPECT_EQ(random.next(), 6457827717110365317u);
    EXPECT_EQ(random.next(), 3203168211198807973u);
    EXPECT_EQ(random.next(), 9817491932198370423u);
    EXPECT_EQ(random.next(), 4593380528125082431u);
    EXPECT_EQ(random.next(), 16408922859458223821u);
}

TEST(SynthRandom, UniformNumbersAreTheUpper53Bits) {
    Random random(1234567);
    // 6457827717110365317 / 2^64, cut to 53 bits
    EXPECT_EQ(random.uniform(), 0.3500795420214081);
    EXPECT_EQ(random.between(10, 20), 10 + 10 * 0.17364409667091263);
}

TEST(SynthRandom, UniformNumbersFillTheirRangeEvenly) {
    Random random(1);
    double sum = 0;
    for (int i = 0; i < 100000; ++i) {
        const double drawn = random.uniform();
        ASSERT_GE(drawn, 0);
        ASSERT_LT(drawn, 1);
        sum += drawn;
    }
    EXPECT_NEAR(sum / 100000, 0.5, 0.004); // 4 sd of the mean: 4 * 0.2887 / sqrt(100000)
}

TEST(SynthRandom, GaussianNumbersHaveMean0AndDeviation1) {
    Random random(2);
    double sum = 0, squares = 0;
    int beyondTwo = 0;
    for (int i = 0; i < 100000; ++i) {
        const double drawn = random.gaussian();
        ASSERT_LE(std::abs(drawn), 6);
        sum += drawn;
        squares += drawn * drawn;
        beyondTwo += std::abs(drawn) > 2;
    }
    EXPECT_NEAR(sum / 100000, 0, 0.013);
    EXPECT_NEAR(squares / 100000, 1, 0.018);
    EXPECT_NEAR(beyondTwo / 100000.0, 0.0455, 0.004); // the normal distribution's share
}

TEST(SynthRandom, AllChoicesAreDrawn) {
    Random random(3);
    std::array<int, 3> counts{};
    for (int i = 0; i < 3000; ++i)
        ++counts[random.below(3)];
    for (const int count : counts)
        EXPECT_NEAR(count, 1000, 120);
}

TEST(SynthRandom, ASplitGeneratorDoesNotMoveWhenTheOtherDraws) {
    Random quiet(7), busy(7);
    Random fromQuiet = quiet.split();
    Random fromBusy = busy.split();
    for (int i = 0; i < 10; ++i)
        static_cast<void>(busy.next());
    EXPECT_EQ(fromQuiet.next(), fromBusy.next());
}

} // namespace
} // namespace ZorvaTouch::Synth

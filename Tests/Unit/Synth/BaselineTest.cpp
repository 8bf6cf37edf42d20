#include "Synth/Baseline.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Synth {
namespace {

constexpr double kPeriod = 0.01; // s

SensorModel::RawCounts counts(std::uint16_t value) {
    SensorModel::RawCounts raw{};
    raw.fill(value);
    return raw;
}

/// One electrode's signal after the same measurement was made `times`.
std::int16_t feed(Baseline &baseline, std::uint16_t value, int times) {
    std::int16_t signal = 0;
    for (int i = 0; i < times; ++i)
        signal = baseline.update(counts(value), kPeriod)[4];
    return signal;
}

TEST(SynthBaseline, BeginsWithTheMeanOfTheFirstMeasurements) {
    const Parameters parameters;
    Baseline baseline(parameters);
    EXPECT_EQ(feed(baseline, 20000, 1), 0);
    EXPECT_EQ(feed(baseline, 20010, 1), 5); // the mean is 20005
    EXPECT_EQ(feed(baseline, 20005, 1), 0);
}

TEST(SynthBaseline, AFingerIsTheDifference) {
    const Parameters parameters;
    Baseline baseline(parameters);
    feed(baseline, 20000, 10);
    EXPECT_EQ(feed(baseline, 20400, 1), 400);
}

TEST(SynthBaseline, AFingerIsNotFollowed) {
    const Parameters parameters;
    Baseline baseline(parameters);
    feed(baseline, 20000, 10);
    EXPECT_EQ(feed(baseline, 20400, 100'000), 400); // 1000 s
}

TEST(SynthBaseline, AnUntouchedElectrodeIsFollowedSlowly) {
    const Parameters parameters;
    Baseline baseline(parameters);
    feed(baseline, 20000, 10);
    EXPECT_EQ(feed(baseline, 20020, 1), 20);   // within the band of 30
    EXPECT_EQ(feed(baseline, 20020, 400), 7);  // 4 s: 20 / e
    EXPECT_EQ(feed(baseline, 20020, 4000), 0); // 40 s
}

TEST(SynthBaseline, BelowTheBandItIsFollowedQuickly) {
    const Parameters parameters;
    Baseline baseline(parameters);
    feed(baseline, 20000, 10);
    EXPECT_EQ(feed(baseline, 19700, 1), -285);       // a twentieth at once: 10 ms of 0.2 s
    EXPECT_NEAR(feed(baseline, 19700, 19), -108, 2); // 0.2 s: 300 x 0.95^20
    EXPECT_GT(feed(baseline, 19700, 40), -31);       // 0.6 s: back in the band
}

TEST(SynthBaseline, WhatLiesOnTheSensorDuringAResetVanishes) {
    const Parameters parameters;
    Baseline baseline(parameters);
    feed(baseline, 20000, 10);
    baseline.reset();
    EXPECT_EQ(feed(baseline, 20400, 50), 0);
    EXPECT_EQ(feed(baseline, 20000, 1), -380); // lifted: 400, less the twentieth that is followed
}

} // namespace
} // namespace ZorvaTouch::Synth

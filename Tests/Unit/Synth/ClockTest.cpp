#include "Synth/Clock.h"

#include <gtest/gtest.h>

#include <cmath>

namespace ZorvaTouch::Synth {
namespace {

constexpr std::uint64_t kStartNs = 5'000'000'000;

TEST(SynthClock, Measures100TimesASecond) {
    const Parameters parameters;
    Clock clock(kStartNs, parameters, Random(1));
    for (int i = 0; i < 100'000; ++i)
        clock.step();
    EXPECT_NEAR(static_cast<double>(clock.now()) * 1e-6, 1000, 0.0012); // six times the jitter
}

TEST(SynthClock, JittersAroundAnEvenBeat) {
    const Parameters parameters;
    Clock clock(kStartNs, parameters, Random(1));
    double squares = 0;
    for (int i = 1; i <= 20'000; ++i) {
        clock.step();
        const double offMs = static_cast<double>(clock.now()) / 1000 - 10.0 * i;
        squares += offMs * offMs;
    }
    EXPECT_NEAR(std::sqrt(squares / 20'000), 0.2, 0.005);
}

TEST(SynthClock, NeverGoesBackHoweverMuchItJitters) {
    Parameters parameters;
    parameters.periodJitter = 100;
    parameters.hostJitter = 50;
    Clock clock(kStartNs, parameters, Random(1));
    std::uint64_t lastHostNs = 0;
    for (int i = 0; i < 10'000; ++i) {
        const Microseconds before = clock.now();
        clock.step();
        ASSERT_GE(clock.now(), before);
        const std::uint64_t hostNs = clock.reportHostNs(clock.now());
        ASSERT_GE(hostNs, lastHostNs);
        lastHostNs = hostNs;
    }
}

TEST(SynthClock, StepsAreTheTimeBetweenMeasurements) {
    Parameters parameters;
    parameters.periodJitter = 0;
    parameters.reportRate = 50;
    Clock clock(kStartNs, parameters, Random(1));
    clock.step();
    clock.step();
    EXPECT_EQ(clock.now(), 40'000u);
    EXPECT_DOUBLE_EQ(clock.stepSeconds(), 0.02);
}

TEST(SynthClock, TheHostIsLateByLatencyAndJitter) {
    Parameters parameters;
    parameters.hostLatency = 2;
    parameters.hostJitter = 0.5;
    Clock clock(kStartNs, parameters, Random(1));
    EXPECT_EQ(clock.hostNs(10'000), 5'012'000'000u);
    double sumMs = 0;
    for (Microseconds time = 20'000; time <= 100'000'000; time += 10'000) {
        const double lateMs = static_cast<double>(clock.reportHostNs(time) - kStartNs) * 1e-6 -
                              static_cast<double>(time) * 1e-3;
        ASSERT_GE(lateMs, 1.999);
        ASSERT_LT(lateMs, 2.501);
        sumMs += lateMs;
    }
    EXPECT_NEAR(sumMs / 9999, 2.25, 0.01);
}

TEST(SynthClock, ShowsTheSensorsMilliseconds) {
    const Parameters parameters;
    const Clock clock(kStartNs, parameters, Random(1));
    EXPECT_EQ(clock.sensorMs(0), 0u);
    EXPECT_EQ(clock.sensorMs(1'234'999), 1234u);
}

TEST(SynthClock, AResetStartsTheSensorsCountersAgain) {
    Parameters parameters;
    parameters.periodJitter = 0;
    parameters.bootTime = 60;
    Clock clock(kStartNs, parameters, Random(1));
    clock.step(); // 10 ms
    EXPECT_EQ(clock.takeFrameNumber(), 0u);
    EXPECT_EQ(clock.takeFrameNumber(), 1u);
    EXPECT_FALSE(clock.isBooting());
    clock.reset(5'000);
    EXPECT_TRUE(clock.isBooting());
    EXPECT_EQ(clock.lastReset(), 5'000u);
    EXPECT_EQ(clock.sensorMs(105'000), 100u);
    EXPECT_EQ(clock.takeFrameNumber(), 0u);
    for (int i = 0; i < 5; ++i)
        clock.step(); // 60 ms
    EXPECT_TRUE(clock.isBooting());
    clock.step(); // 70 ms; it boots until 65
    EXPECT_FALSE(clock.isBooting());
    EXPECT_GT(clock.hostNs(70'000), kStartNs + 70'000'000); // the host's clock goes on
}

} // namespace
} // namespace ZorvaTouch::Synth

#include "Synth/SensorModel.h"

#include "Synth/Electrodes.h"

#include <gtest/gtest.h>

#include <cmath>
#include <vector>

// The model's output against the numbers in Docs/Synth.md.

namespace ZorvaTouch::Synth {
namespace {

constexpr double kPeriod = 0.01; // s
constexpr std::size_t kH = 7, kK = 10;

/// A sensor on which nothing happens by chance.
Parameters still() {
    Parameters parameters;
    parameters.gainSpread = parameters.noise = parameters.commonNoise = 0;
    parameters.drift = parameters.warmDrift = parameters.offsetSpread = 0;
    return parameters;
}

struct Spread {
    double mean, deviation;
};

Spread spreadOf(const std::vector<double> &values) {
    double sum = 0, squares = 0;
    for (const double value : values)
        sum += value;
    const double mean = sum / static_cast<double>(values.size());
    for (const double value : values)
        squares += (value - mean) * (value - mean);
    return {.mean = mean, .deviation = std::sqrt(squares / static_cast<double>(values.size()))};
}

/// What some function makes of each of many measurements of an untouched sensor.
template <typename Function>
std::vector<double> measureIdle(const Parameters &parameters, int count, double period, Function function) {
    SensorModel sensor(parameters, Random(1));
    std::vector<double> values;
    for (int i = 0; i < count; ++i)
        values.push_back(function(sensor.measure({}, period)));
    return values;
}

TEST(SynthSensorModel, EachElectrodeHasItsNoise) {
    Parameters parameters = still();
    parameters.noise = 3;
    const Spread spread =
        spreadOf(measureIdle(parameters, 20000, kPeriod, [](const auto &raw) { return raw[kH]; }));
    EXPECT_NEAR(spread.mean, 20000, 0.1);
    EXPECT_NEAR(spread.deviation, 3.01, 0.08); // rounding adds 1/12 to the variance
}

TEST(SynthSensorModel, NoiseOfTwoElectrodesIsIndependent) {
    Parameters parameters = still();
    parameters.noise = 3;
    const Spread difference =
        spreadOf(measureIdle(parameters, 20000, kPeriod, [](const auto &raw) { return raw[kH] - raw[kK]; }));
    EXPECT_NEAR(difference.deviation, 4.26, 0.12); // sqrt(2) of one
}

TEST(SynthSensorModel, CommonNoiseIsTheSameForAll) {
    Parameters parameters = still();
    parameters.commonNoise = 4;
    const Spread one =
        spreadOf(measureIdle(parameters, 20000, kPeriod, [](const auto &raw) { return raw[kH]; }));
    const Spread difference =
        spreadOf(measureIdle(parameters, 20000, kPeriod, [](const auto &raw) { return raw[kH] - raw[kK]; }));
    EXPECT_NEAR(one.deviation, 4.01, 0.1);
    EXPECT_EQ(difference.deviation, 0);
}

TEST(SynthSensorModel, DriftKeepsItsDeviationForEver) {
    Parameters parameters = still();
    parameters.drift = 50;
    parameters.driftTime = 1;
    // 2000 s in steps of 0.1 s are some 1000 independent values
    const Spread spread =
        spreadOf(measureIdle(parameters, 20000, 0.1, [](const auto &raw) { return raw[kH]; }));
    EXPECT_NEAR(spread.mean, 20000, 8);
    EXPECT_NEAR(spread.deviation, 50, 5);
}

TEST(SynthSensorModel, DriftForgetsItselfInItsTime) {
    Parameters parameters = still();
    parameters.drift = 50;
    parameters.driftTime = 1;
    const auto values = measureIdle(parameters, 200000, kPeriod, [](const auto &raw) { return raw[kH]; });
    double product = 0;
    for (std::size_t i = 0; i + 100 < values.size(); ++i) // 100 measurements are 1 s
        product += (values[i] - 20000) * (values[i + 100] - 20000);
    const double correlation = product / static_cast<double>(values.size() - 100) / (50.0 * 50.0);
    EXPECT_NEAR(correlation, 0.368, 0.06); // 1/e
}

TEST(SynthSensorModel, SlowDriftHardlyMovesWithinASecond) {
    Parameters parameters = still();
    parameters.drift = 5;
    const Spread spread =
        spreadOf(measureIdle(parameters, 100, kPeriod, [](const auto &raw) { return raw[kH]; }));
    EXPECT_LT(spread.deviation, 3); // over 20 s it is 5
}

TEST(SynthSensorModel, GainsDifferFromSensorToSensor) {
    Parameters parameters = still();
    parameters.gainSpread = 5;
    const Blob blob{
        .centre = pads()[0].centre, .width = 200, .height = 1}; // the same everywhere; pad 0 is H's
    std::vector<double> signals;
    for (std::uint64_t seed = 0; seed < 2000; ++seed)
        signals.push_back(SensorModel(parameters, Random(seed)).measure({&blob, 1}, kPeriod)[kH] - 20000.0);
    const Spread spread = spreadOf(signals);
    EXPECT_NEAR(spread.mean, 800, 4);
    EXPECT_NEAR(spread.deviation, 40, 3); // 5 % of 800
}

TEST(SynthSensorModel, OffsetsDifferFromElectrodeToElectrode) {
    Parameters parameters = still();
    parameters.offsetSpread = 1500;
    std::vector<double> offsets;
    for (std::uint64_t seed = 0; seed < 2000; ++seed)
        offsets.push_back(SensorModel(parameters, Random(seed)).measure({}, kPeriod)[kK]);
    EXPECT_NEAR(spreadOf(offsets).mean, 20000, 140);
    EXPECT_NEAR(spreadOf(offsets).deviation, 1500, 100);
}

/// Signal of electrode H under a blob at full pressure, `dx` millimetres to the right of it.
double signalBeside(double dx, double width) {
    SensorModel sensor(still(), Random(1));
    const Blob blob{
        .centre = {.x = pads()[0].centre.x + dx, .y = pads()[0].centre.y}, .width = width, .height = 1};
    return sensor.measure({&blob, 1}, kPeriod)[kH] - 20000.0;
}

TEST(SynthSensorModel, AFingerIsAsWideAsItSays) {
    // A pad of 2 by 1 mm sees the mean of the blob around its centre, so the middle is a little lower than
    // 800 and the half height a little farther out than the 3 mm of the blob itself.
    const double middle = signalBeside(0, 6);
    // Its quarters' middles are sqrt(0.5^2 + 0.25^2) mm away: 800 (1 - 0.3125 x 0.2063 / 9)^3 = 782.9.
    EXPECT_EQ(middle, 783);
    EXPECT_GT(signalBeside(2.9, 6), middle / 2);
    EXPECT_LT(signalBeside(3.2, 6), middle / 2);
    EXPECT_EQ(signalBeside(3.05, 6), signalBeside(-3.05, 6));
}

TEST(SynthSensorModel, APalmIsAsWideAsItSays) {
    EXPECT_NEAR(signalBeside(10, 20) / signalBeside(0, 20), 0.5, 0.01);
}

TEST(SynthSensorModel, AFingerOnOneOfTwoPadsGivesTheWholeSignal) {
    SensorModel sensor(still(), Random(1));
    const std::array<Pad, kPadCount> &all = pads();
    ASSERT_EQ(all[3].electrode, 1u); // B, on the left
    const Blob blob{.centre = all[3].centre, .width = 6, .height = 1};
    const auto raw = sensor.measure({&blob, 1}, kPeriod);
    EXPECT_EQ(raw[1] - 20000, 416); // 782.9 / 1.8833; its other pad is beyond the blob
}

TEST(SynthSensorModel, CoverageAddsUpOverContacts) {
    const Blob blob{.centre = pads()[11].centre, .width = 6, .height = 0.25};
    const std::array<Blob, 2> both{blob, blob};
    EXPECT_DOUBLE_EQ(coverageOf(both)[kK], 2 * coverageOf({&blob, 1})[kK]);
}

TEST(SynthSensorModel, AHoldWarmsTheSensor) {
    Parameters parameters = still();
    parameters.warmDrift = 100;
    parameters.warmTime = 5;
    SensorModel sensor(parameters, Random(1));
    const Blob blob{.centre = pads()[0].centre, .width = 200, .height = 1};
    for (int i = 0; i < 500; ++i) // 5 s
        static_cast<void>(sensor.measure({&blob, 1}, kPeriod));
    // The finger is gone: what is left is the warming, 100 (1 - 1/e).
    EXPECT_NEAR(20000.0 - sensor.measure({}, kPeriod)[kH], 63.2, 1);
}

TEST(SynthSensorModel, RawCountsStayWithin16Bits) {
    Parameters parameters = still();
    parameters.offset = 65000;
    SensorModel high(parameters, Random(1));
    const Blob blob{.centre = pads()[0].centre, .width = 200, .height = 1};
    EXPECT_EQ(high.measure({&blob, 1}, kPeriod)[kH], 65535);
    parameters.offset = 0;
    parameters.noise = 10;
    SensorModel low(parameters, Random(1));
    for (int i = 0; i < 100; ++i)
        EXPECT_LT(low.measure({}, kPeriod)[kH], 100);
}

} // namespace
} // namespace ZorvaTouch::Synth

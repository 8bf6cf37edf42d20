#include "Synth/Accelerometer.h"

#include <gtest/gtest.h>

#include <cmath>

namespace ZorvaTouch::Synth {
namespace {

struct Reading {
    double x, y, z;
};

Reading read(Accelerometer &accelerometer, std::span<const Contact> contacts, Microseconds time) {
    const PropertyValue value = accelerometer.measure(contacts, time);
    return {.x = *value.find("X")->asDouble(),
            .y = *value.find("Y")->asDouble(),
            .z = *value.find("Z")->asDouble()};
}

TEST(SynthAccelerometer, FeelsOneG) {
    Parameters parameters;
    parameters.accelNoise = 0;
    for (std::uint64_t seed = 0; seed < 50; ++seed) {
        Accelerometer accelerometer(parameters, Random(seed));
        const Reading rest = read(accelerometer, {}, 0);
        EXPECT_NEAR(std::sqrt(rest.x * rest.x + rest.y * rest.y + rest.z * rest.z), 1,
                    0.002); // steps of 1/512
    }
}

TEST(SynthAccelerometer, HasNoise) {
    Parameters parameters;
    parameters.accelNoise = 0.02;
    Accelerometer accelerometer(parameters, Random(1));
    double sum = 0, squares = 0;
    for (int i = 0; i < 10'000; ++i) {
        const double x = read(accelerometer, {}, 0).x;
        sum += x;
        squares += x * x;
    }
    const double mean = sum / 10'000;
    EXPECT_NEAR(std::sqrt(squares / 10'000 - mean * mean), 0.02, 0.001);
}

TEST(SynthAccelerometer, ReadsInStepsThatA32BitFloatHolds) {
    const Parameters parameters;
    Accelerometer accelerometer(parameters, Random(1));
    for (int i = 0; i < 100; ++i) {
        const double steps = 512 * read(accelerometer, {}, 0).y;
        EXPECT_EQ(steps, std::floor(steps));
    }
}

TEST(SynthAccelerometer, AContactBumpsItAsItBegins) {
    Parameters parameters;
    parameters.accelNoise = 0;
    parameters.accelBump = 0.15;
    Accelerometer accelerometer(parameters, Random(1));
    Contact contact;
    contact.start = 1'000'000;
    contact.pressure = 0.8;
    contact.attack = 20'000;
    contact.duration = 200'000;
    const Reading before = read(accelerometer, {&contact, 1}, 999'999);
    const Reading bumped = read(accelerometer, {&contact, 1}, 1'013'333); // a third of the bump's 40 ms
    const Reading after = read(accelerometer, {&contact, 1}, 1'040'000);
    EXPECT_NEAR(before.z - bumped.z, 0.12, 0.002); // 0.15 x 0.8
    EXPECT_EQ(bumped.x, before.x);
    EXPECT_EQ(after.z, before.z);
}

TEST(SynthAccelerometer, SlowContactsBumpLess) {
    Parameters parameters;
    parameters.accelNoise = 0;
    parameters.accelBump = 0.15;
    Accelerometer accelerometer(parameters, Random(1));
    Contact contact;
    contact.pressure = 1;
    contact.attack = 300'000; // ten times as slow as what still bumps fully
    const Reading bumped = read(accelerometer, {&contact, 1}, 13'333);
    EXPECT_NEAR(read(accelerometer, {}, 0).z - bumped.z, 0.015, 0.002);
}

TEST(SynthAccelerometer, SamplesAtItsRate) {
    Parameters parameters;
    parameters.accelRate = 100;
    Accelerometer accelerometer(parameters, Random(1));
    EXPECT_EQ(accelerometer.takeSample(25'000), 0u);
    EXPECT_EQ(accelerometer.takeSample(25'000), 10'000u);
    EXPECT_EQ(accelerometer.takeSample(25'000), 20'000u);
    EXPECT_EQ(accelerometer.takeSample(25'000), std::nullopt);
    EXPECT_EQ(accelerometer.takeSample(30'000), 30'000u);
}

TEST(SynthAccelerometer, IsOffUnlessItHasARate) {
    const Parameters parameters;
    Accelerometer accelerometer(parameters, Random(1));
    EXPECT_EQ(accelerometer.takeSample(1'000'000'000), std::nullopt);
}

} // namespace
} // namespace ZorvaTouch::Synth

#include "Synth/Contact.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Synth {
namespace {

/// Pressed to 0.8 within 20 ms, let go within the last 50 of 200 ms, in the middle of the sensor.
Contact makeContact() {
    Contact contact;
    contact.width = 6;
    contact.pressure = 0.8;
    contact.attack = 20'000;
    contact.duration = 200'000;
    contact.release = 50'000;
    contact.stopAt({.x = 9, .y = 6}, 0, 0);
    return contact;
}

Parameters withoutTremor() {
    Parameters parameters;
    parameters.tremor = 0;
    return parameters;
}

TEST(SynthContact, ABlobIsHalfAsHighHalfAWidthAway) {
    const Blob blob{.centre = {.x = 9, .y = 6}, .width = 6, .height = 0.5};
    EXPECT_DOUBLE_EQ(blob.at({.x = 9, .y = 6}), 0.5);
    EXPECT_NEAR(blob.at({.x = 12, .y = 6}), 0.25, 1e-12);
    EXPECT_NEAR(blob.at({.x = 9, .y = 3}), 0.25, 1e-12);
    // half a width in a direction between: 3 * (0.6, 0.8)
    EXPECT_NEAR(blob.at({.x = 10.8, .y = 8.4}), 0.25, 1e-12);
}

TEST(SynthContact, ABlobEnds1Point1WidthsAway) {
    const Blob blob{.centre = {}, .width = 10, .height = 1};
    EXPECT_GT(blob.at({.x = 11, .y = 0}), 0); // the edge is at 5 / sqrt(0.2063) = 11.008
    EXPECT_EQ(blob.at({.x = 11.1, .y = 0}), 0);
}

TEST(SynthContact, PressureRisesStaysAndFalls) {
    const Contact contact = makeContact();
    const Parameters parameters = withoutTremor();
    EXPECT_EQ(contact.pressureAt(0, parameters), 0);
    EXPECT_DOUBLE_EQ(contact.pressureAt(10'000, parameters), 0.4);  // half-way up a smooth step
    EXPECT_DOUBLE_EQ(contact.pressureAt(5'000, parameters), 0.125); // 0.8 (3/16 - 2/64)
    EXPECT_DOUBLE_EQ(contact.pressureAt(20'000, parameters), 0.8);
    EXPECT_DOUBLE_EQ(contact.pressureAt(150'000, parameters), 0.8);
    EXPECT_DOUBLE_EQ(contact.pressureAt(175'000, parameters), 0.4);
    EXPECT_EQ(contact.pressureAt(200'000, parameters), 0);
    EXPECT_EQ(contact.pressureAt(1'000'000, parameters), 0);
}

TEST(SynthContact, PressureSagsEvenly) {
    Contact contact = makeContact();
    contact.sag = 0.5;
    EXPECT_DOUBLE_EQ(contact.pressureAt(100'000, withoutTremor()), 0.6); // 0.8 (1 - 0.5 / 2)
}

TEST(SynthContact, TremorShakesThePressureByItsPart) {
    const Contact contact = makeContact();
    Parameters parameters;
    parameters.tremor = 10;
    parameters.tremorRate = 10; // a turn is 100 ms
    EXPECT_DOUBLE_EQ(contact.pressureAt(100'000, parameters), 0.8);
    EXPECT_DOUBLE_EQ(contact.pressureAt(125'000, parameters), 0.88);
    EXPECT_DOUBLE_EQ(contact.pressureAt(75'000, parameters), 0.72);
}

TEST(SynthContact, ABlobGrowsWithPressure) {
    Contact contact = makeContact();
    contact.pressure = 0.25;
    const Blob blob = contact.blobAt(100'000, withoutTremor());
    EXPECT_DOUBLE_EQ(blob.height, 0.25);
    EXPECT_DOUBLE_EQ(blob.width, 5.25); // 6 (0.75 + 0.25 sqrt(0.25))
    contact.pressure = 1;
    EXPECT_DOUBLE_EQ(contact.blobAt(100'000, withoutTremor()).width, 6);
}

TEST(SynthContact, RestsAtItsStopsAndMovesSmoothlyBetween) {
    Contact contact;
    contact.stopAt({.x = 1, .y = 10}, 0, 100);
    contact.stopAt({.x = 5, .y = 2}, 300, 400);
    contact.stopAt({.x = 9, .y = 2}, 600, 600);
    const auto xAt = [&](Microseconds time) { return contact.centreAt(time).x; };
    EXPECT_DOUBLE_EQ(xAt(0), 1);
    EXPECT_DOUBLE_EQ(xAt(100), 1);
    EXPECT_DOUBLE_EQ(xAt(150), 1.625); // a quarter of the time: 3/16 - 2/64 = 5/32 of the way
    EXPECT_DOUBLE_EQ(xAt(200), 3);
    EXPECT_DOUBLE_EQ(contact.centreAt(200).y, 6);
    EXPECT_DOUBLE_EQ(xAt(300), 5);
    EXPECT_DOUBLE_EQ(xAt(400), 5);
    EXPECT_DOUBLE_EQ(xAt(500), 7);
    EXPECT_DOUBLE_EQ(xAt(10'000), 9);
}

} // namespace
} // namespace ZorvaTouch::Synth

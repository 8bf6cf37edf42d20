#include "Shared/HostEvent.h"

#include <gtest/gtest.h>

#include <limits>

namespace ZorvaTouch {
namespace {

TEST(HostEvent, ADigitizerKeepsItsFields) {
    const DigitizerFields fields{.transducerType = 2,
                                 .transducerIndex = 3,
                                 .identity = 4,
                                 .eventMask = 0x20000,
                                 .buttonMask = 5,
                                 .x = 0.25,
                                 .y = 3.0,
                                 .z = -1.5,
                                 .tipPressure = 0.5,
                                 .barrelPressure = 0.75,
                                 .inRange = true,
                                 .touch = true};
    const auto event = HostEvent::createDigitizer(77, fields, 9);
    EXPECT_EQ(event->type(), HostEventType::Digitizer);
    EXPECT_EQ(static_cast<std::uint32_t>(event->type()), 11u);
    EXPECT_EQ(event->timestamp(), 77u);
    EXPECT_EQ(event->options(), 9u);
    EXPECT_EQ(event->vendorDefined(), nullptr);
    ASSERT_NE(event->digitizer(), nullptr);
    EXPECT_EQ(event->digitizer()->transducerIndex, 3u);
    EXPECT_EQ(event->digitizer()->eventMask, 0x20000u);
    EXPECT_EQ(event->digitizer()->z, -1.5);
    EXPECT_TRUE(event->digitizer()->touch);
}

TEST(HostEvent, AVendorDefinedEventKeepsItsFields) {
    const auto event = HostEvent::createVendorDefined(78, {0xFF60, 2, 1, {1, 2, 3}}, 0);
    EXPECT_EQ(event->type(), HostEventType::VendorDefined);
    EXPECT_EQ(static_cast<std::uint32_t>(event->type()), 1u);
    EXPECT_EQ(event->digitizer(), nullptr);
    ASSERT_NE(event->vendorDefined(), nullptr);
    EXPECT_EQ(event->vendorDefined()->usagePage, 0xFF60);
    EXPECT_EQ(event->vendorDefined()->usage, 2);
    EXPECT_EQ(event->vendorDefined()->version, 1u);
    EXPECT_EQ(event->vendorDefined()->payload, (std::vector<std::uint8_t>{1, 2, 3}));
}

TEST(HostEvent, PhaseAndTimeStampCanBeChanged) {
    const auto event = HostEvent::createDigitizer(0, {}, 0);
    EXPECT_EQ(event->phase(), kEventPhaseNone);
    event->setPhase(kEventPhaseMayBegin);
    EXPECT_EQ(event->phase(), 128);
    event->setTimestamp(18446744073709551615u);
    EXPECT_EQ(event->timestamp(), 18446744073709551615u);
}

TEST(HostEvent, AnIntegerFieldIsAbsentUntilItIsSet) {
    const auto event = HostEvent::createDigitizer(0, {}, 0);
    EXPECT_FALSE(event->integerField(0xB001B).has_value());
    event->setIntegerField(0xB001B, 0);
    EXPECT_EQ(event->integerField(0xB001B), 0);
    event->setIntegerField(0xB001B, -5);
    event->setIntegerField(0xB001C, 7);
    EXPECT_EQ(event->integerField(0xB001B), -5) << "the last write holds";
    EXPECT_EQ(event->integerField(0xB001C), 7);
}

TEST(HostEvent, IsOneLineOfJson) {
    const auto event = HostEvent::createDigitizer(123, {.eventMask = 2, .y = 3.0}, 0);
    event->setPhase(kEventPhaseBegan);
    event->setIntegerField(kDigitizerFieldFrameNumber, 57);
    EXPECT_EQ(jsonText(*event), R"({"mask":2,"phase":1,"y":3,"frame":57})");
}

TEST(HostEvent, AnUnsetPhaseIsNullInJson) {
    const auto event = HostEvent::createDigitizer(123, {.eventMask = 0x20000, .y = 1.0}, 0);
    event->setIntegerField(kDigitizerFieldFrameNumber, 4294967295);
    EXPECT_EQ(jsonText(*event), R"({"mask":131072,"phase":null,"y":1,"frame":4294967295})");
}

TEST(HostEvent, AVendorDefinedEventIsOneLineOfJson) {
    EXPECT_EQ(jsonText(*HostEvent::createVendorDefined(5, {0xFF60, 2, 0, {}}, 0)),
              R"({"vendor":true,"usagePage":65376,"usage":2})");
}

TEST(HostEvent, AnAccelerometerEventHasItsTypeAndFields) {
    const auto event = HostEvent::createAccelerometer(9, {0.5F, -0.25F, 1.0F}, 7);
    EXPECT_EQ(event->type(), HostEventType::Accelerometer);
    EXPECT_EQ(static_cast<std::uint32_t>(event->type()), 13U);
    EXPECT_EQ(event->timestamp(), 9U);
    EXPECT_EQ(event->options(), 7U);
    ASSERT_NE(event->accelerometer(), nullptr);
    EXPECT_EQ(event->accelerometer()->y, -0.25F);
    EXPECT_EQ(event->digitizer(), nullptr);
    EXPECT_EQ(event->vendorDefined(), nullptr);
}

TEST(HostEvent, AnAccelerometerEventIsOneLineOfJson) {
    EXPECT_EQ(jsonText(*HostEvent::createAccelerometer(5, {0.5F, -0.0F, 1.0F}, 0)),
              R"({"accelerometer":true,"x":0.5,"y":-0.0,"z":1.0})");
    constexpr float kInfinity = std::numeric_limits<float>::infinity();
    EXPECT_EQ(jsonText(*HostEvent::createAccelerometer(5, {kInfinity, 0.0F, 2.0F}, 0)),
              R"({"accelerometer":true,"x":null,"y":0.0,"z":2.0})");
}

} // namespace
} // namespace ZorvaTouch

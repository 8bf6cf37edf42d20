#include "Tools/Daemon/DaemonChoices.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

Linux::AccelIdentity accelerometer(const char *name) {
    Linux::AccelIdentity identity;
    identity.devnode = "/dev/iio:device0";
    identity.name = name;
    return identity;
}

bool takes(const AccelOption &option, const char *name) {
    return accelChoiceOf(option).fits(accelerometer(name));
}

TEST(DaemonChoices, WithoutDevicesTheMakesCount) {
    DaemonOptions options;
    options.ids = {{0x1234, 0xABCF}};
    EXPECT_THAT(deviceFilterOf(options).ids, ElementsAre(Linux::HidId{0x1234, 0xABCF}));
    EXPECT_THAT(deviceFilterOf(options).nodes, IsEmpty());
}

TEST(DaemonChoices, NodesThatAreNamedAreTheOnlyOnes) {
    DaemonOptions options;
    options.devices = {"/dev/hidraw3", SimulatedFinger{}, "/dev/touch"};
    EXPECT_THAT(deviceFilterOf(options).ids, IsEmpty());
    EXPECT_THAT(deviceFilterOf(options).nodes, ElementsAre("/dev/hidraw3", "/dev/touch"));
}

TEST(DaemonChoices, SimulatedOnesAloneAskTheSystemForNothing) {
    DaemonOptions options;
    options.devices = {SimulatedFinger{}};
    EXPECT_THAT(deviceFilterOf(options).ids, IsEmpty());
    EXPECT_THAT(deviceFilterOf(options).nodes, IsEmpty());
}

TEST(DaemonChoices, AccelerometersFitByTheOption) {
    using Choice = AccelOption::Choice;
    EXPECT_TRUE(takes({.choice = Choice::Any, .name = ""}, "accel_3d"));
    EXPECT_FALSE(takes({.choice = Choice::None, .name = ""}, "accel_3d"));
    EXPECT_TRUE(takes({.choice = Choice::Named, .name = "accel_3d"}, "accel_3d"));
    EXPECT_FALSE(takes({.choice = Choice::Named, .name = "accel_3d"}, "other"));
    EXPECT_FALSE(takes({.choice = Choice::Named, .name = "none"}, "accel_3d")); // a name like any other
}

} // namespace
} // namespace ZorvaTouch::Tools

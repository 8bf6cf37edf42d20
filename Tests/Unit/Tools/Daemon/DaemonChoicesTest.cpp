#include "Tools/Daemon/DaemonChoices.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <stdexcept>
#include <string>

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

std::string refusalOf(const std::string &node) {
    try {
        requireNodes({.ids = {}, .nodes = {node}});
        return {};
    } catch (const std::runtime_error &error) {
        return error.what();
    }
}

TEST(DaemonChoices, ANodeThatIsSomethingElseIsRefused) {
    for (const std::string node : {"/etc/passwd", "/dev/null", "/dev"})
        EXPECT_EQ(refusalOf(node), node + ": must be a hidraw device node, as /dev/hidraw0 is");
    EXPECT_EQ(refusalOf("/dev/null/hidraw0"), "/dev/null/hidraw0: Not a directory");
}

TEST(DaemonChoices, ANodeThatDoesNotExistYetIsNot) { EXPECT_EQ(refusalOf("/dev/no-such-node"), ""); }

TEST(DaemonChoices, SimulatedOnesAloneAskTheSystemForNothing) {
    DaemonOptions options;
    options.devices = {SimulatedFinger{}};
    EXPECT_THAT(deviceFilterOf(options).ids, IsEmpty());
    EXPECT_THAT(deviceFilterOf(options).nodes, IsEmpty());
}

TEST(DaemonChoices, KeysArePressedForRealSurfacesAndForSimulatedOnesOnRequest) {
    DaemonOptions options;
    EXPECT_TRUE(pressesKeys(options));
    options.devices = {SimulatedFinger{}};
    EXPECT_FALSE(pressesKeys(options));
    options.sendsSimulatedKeys = true;
    EXPECT_TRUE(pressesKeys(options));
    options.sendsSimulatedKeys = false;
    options.devices.emplace_back("/dev/hidraw3");
    EXPECT_TRUE(pressesKeys(options));
    options.sendsKeys = false;
    EXPECT_FALSE(pressesKeys(options));
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

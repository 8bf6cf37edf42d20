#include "Host/Linux/IioAccelerometer.h"

#include "Host/Interface/Platform.h"
#include "Tests/Unit/Host/Linux/AccelClient.h"
#include "Tests/Unit/Host/Linux/IioFakes.h"
#include "Tests/Unit/Host/Linux/SensorFolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <filesystem>
#include <optional>

namespace ZorvaTouch::Linux {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using namespace Tests;

/// An accelerometer of a fake sensor. Once it is made its thread writes the story, and the client's does.
class IioAccelerometers : public testing::Test {
protected:
    void make() {
        accelerometer.emplace(system, AccelIdentity{"/dev/iio:device0", folder.path(), "accel_3d", "", ""},
                              sensor.opener(), log);
    }
    void SetUp() override { log->minimum = Ports::LogLevel::Default; }

    Story story;
    const std::shared_ptr<StoryLog> log = std::make_shared<StoryLog>(story);
    SensorFolder folder;
    FakeSensor sensor{story};
    const std::shared_ptr<Host::EventSystem> system = Host::EventSystem::create();
    std::optional<IioAccelerometer> accelerometer;
    std::optional<AccelClient> client, second;
};

// --- Listening ---------------------------------------------------------------------------------------------

TEST_F(IioAccelerometers, TheSensorIsOnWhileSomebodyListens) {
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    sensor.send(0, 0, 1000, 77);
    EXPECT_THAT(story.take(1), ElementsAre("0 0 1 at 77"));
    EXPECT_EQ(folder.get("buffer/enable"), "1");
    EXPECT_EQ(folder.get("current_timestamp_clock"), "monotonic");
    client.reset();
    EXPECT_THAT(story.take(1), ElementsAre("closed"));
    EXPECT_EQ(folder.get("buffer/enable"), "0");
}

TEST_F(IioAccelerometers, TheSensorStaysOffWhileNobodyListens) {
    make();
    accelerometer.reset();
    EXPECT_THAT(story.take(0), IsEmpty());
    EXPECT_EQ(folder.get("buffer/length"), "2") << "nothing was touched";
}

TEST_F(IioAccelerometers, TheSensorIsOpenedOnceForSeveralWhoListen) {
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    second.emplace(system, story);
    sensor.send(250, 0, 0, 5);
    EXPECT_THAT(story.take(2), ElementsAre("0.25 0 0 at 5", "0.25 0 0 at 5"));
    client.reset();
    sensor.send(-500, 0, 0, 6);
    EXPECT_THAT(story.take(1), ElementsAre("-0.5 0 0 at 6"));
    second.reset();
    EXPECT_THAT(story.take(1), ElementsAre("closed"));
}

TEST_F(IioAccelerometers, OneThatGoesClosesItsNodeAndIsNoLongerFound) {
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    EXPECT_EQ(client->matchCount(), 1u);
    accelerometer.reset();
    EXPECT_THAT(story.take(1), ElementsAre("closed"));
    EXPECT_EQ(client->matchCount(), 0u);
}

TEST_F(IioAccelerometers, OneThatComesIsHeardByThoseWhoListenAlready) {
    client.emplace(system, story);
    make();
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    sensor.send(1000, 0, 0, 7);
    EXPECT_THAT(story.take(1), ElementsAre("1 0 0 at 7"));
}

// --- Samples -----------------------------------------------------------------------------------------------

TEST_F(IioAccelerometers, SeveralScansOfOneReadAreSeveralSamples) {
    folder.remove("scan_elements/in_timestamp_en");
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    sensor.send({0xE8, 3, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0xD0, 7, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0});
    const Story::Lines lines = story.take(2);
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_THAT(lines[0], testing::StartsWith("1 0 0 at "));
    EXPECT_THAT(lines[1], testing::StartsWith("2 0 0 at "));
}

TEST_F(IioAccelerometers, WithoutATimeOfTheSensorItIsWhenItWasRead) {
    folder.replace("current_timestamp_clock", "/dev/full"); // stays what it is
    make();
    const std::uint64_t before = Host::processPlatform().clock().nowTicks();
    client.emplace(system, story);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    sensor.send(0, 0, 1000, 77);
    static_cast<void>(story.take(1));
    EXPECT_GE(client->lastTimestamp(), before);
}

TEST_F(IioAccelerometers, ATimeBeforeAllTimesIsNone) {
    make();
    const std::uint64_t before = Host::processPlatform().clock().nowTicks();
    client.emplace(system, story);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    sensor.send(0, 0, 1000, -1);
    static_cast<void>(story.take(1));
    EXPECT_GE(client->lastTimestamp(), before);
}

// --- Intervals ---------------------------------------------------------------------------------------------

TEST_F(IioAccelerometers, AskForTheIntervalThatWasSetBeforeAndMeanwhile) {
    log->minimum = Ports::LogLevel::Debug;
    make();
    client.emplace(system, story, 10000.0);
    EXPECT_THAT(story.take(2), ElementsAre("opened", "debug accel_3d at /dev/iio:device0 samples at 100 Hz, "
                                                     "asked for every 10000.000000 us"));
    second.emplace(system, story, 20000.0);
    EXPECT_THAT(story.take(1), ElementsAre("debug accel_3d at /dev/iio:device0 samples at 50 Hz, "
                                           "asked for every 20000.000000 us"));
    EXPECT_EQ(folder.get("in_accel_sampling_frequency"), "50");
}

TEST_F(IioAccelerometers, HaveTheirOwnIntervalUnlessToldOne) {
    log->minimum = Ports::LogLevel::Debug;
    folder.remove("in_accel_sampling_frequency");
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(2),
                ElementsAre("opened", "debug accel_3d at /dev/iio:device0 samples at its own pace"));
}

TEST_F(IioAccelerometers, KeepTheirPaceIfTheyCannotBeAsked) {
    make();
    client.emplace(system, story, 10000.0);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    sensor.send(1000, 0, 0, 3); // heard when the sensor has long been at work
    EXPECT_THAT(story.take(1), ElementsAre("1 0 0 at 3"));
    log->minimum = Ports::LogLevel::Debug;
    folder.replace("in_accel_sampling_frequency", "/dev/full");
    second.emplace(system, story, 20000.0);
    EXPECT_THAT(story.take(1), ElementsAre("debug accel_3d at /dev/iio:device0 keeps its pace: read " +
                                           folder.path() + "/in_accel_sampling_frequency: Message too long"));
    client.reset();
    sensor.send(0, 0, 1000, 4);
    EXPECT_THAT(story.take(1), ElementsAre("0 0 1 at 4"));
}

// --- Failures ----------------------------------------------------------------------------------------------

class IioOpenFailures : public IioAccelerometers,
                        public testing::WithParamInterface<std::pair<int, const char *>> {};

TEST_P(IioOpenFailures, AreOneLineThatSaysWhatToDo) {
    const auto &[errorNumber, text] = GetParam();
    sensor.openErrors = {errorNumber};
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(2),
                ElementsAre("refused", "error no samples of accel_3d at /dev/iio:device0: open "
                                       "/dev/iio:device0: " +
                                           std::string(text)));
    EXPECT_EQ(folder.get("scan_elements/in_accel_x_en"), "0") << "it is somebody else's";
}

INSTANTIATE_TEST_SUITE_P(
    ErrnoByErrno, IioOpenFailures,
    testing::Values(std::pair(EBUSY, "Device or resource busy; another program reads it: stop that one, or "
                                     "choose another accelerometer"),
                    std::pair(EACCES,
                              "Permission denied; give the group of the daemon's user access by a udev rule: "
                              "SUBSYSTEM==\"iio\", GROUP=\"zorvatouch\", MODE=\"0660\""),
                    std::pair(EPERM,
                              "Operation not permitted; give the group of the daemon's user access by a "
                              "udev rule: SUBSYSTEM==\"iio\", GROUP=\"zorvatouch\", MODE=\"0660\""),
                    std::pair(ENOENT, "No such file or directory"), std::pair(ENODEV, "No such device"),
                    std::pair(ENOMEM, "Cannot allocate memory")));

TEST_F(IioAccelerometers, AFailureIsTriedAgainAtTheNextScheduleAndSaidOnce) {
    sensor.openErrors = {EBUSY, EBUSY, 0};
    make();
    client.emplace(system, story);
    ASSERT_EQ(story.take(2).size(), 2u);
    second.emplace(system, story, 10000.0);
    EXPECT_THAT(story.take(1), ElementsAre("refused"));
    second.reset();
    second.emplace(system, story, 10000.0);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
}

TEST_F(IioAccelerometers, AFailureIsSaidAgainToTheNextWhoListens) {
    sensor.openErrors = {EBUSY, EBUSY};
    make();
    client.emplace(system, story);
    const Story::Lines first = story.take(2);
    client.reset();
    client.emplace(system, story);
    EXPECT_EQ(story.take(2), first);
}

TEST_F(IioAccelerometers, ASensorThatCannotBeSetUpIsClosed) {
    folder.set("in_accel_scale", "much");
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(3), ElementsAre("opened", "closed",
                                           "error no samples of accel_3d at /dev/iio:device0: " +
                                               folder.path() + "/in_accel_scale is no number: \"much\""));
    EXPECT_EQ(folder.get("buffer/enable"), "0");
}

TEST_F(IioAccelerometers, AttributesThatCannotBeWrittenAreOneLine) {
    folder.refuseWrites("buffer/enable");
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(3), ElementsAre("opened", "closed",
                                           "error no samples of accel_3d at /dev/iio:device0: write " +
                                               folder.path() + "/buffer/enable: No space left on device"));
}

class IioReadFailures : public IioAccelerometers,
                        public testing::WithParamInterface<std::pair<int, const char *>> {};

TEST_P(IioReadFailures, EndTheReadingWithOneLine) {
    const auto &[errorNumber, text] = GetParam();
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    sensor.hangUp(errorNumber);
    EXPECT_THAT(story.take(2), ElementsAre("closed", text));
    EXPECT_EQ(sensor.reads, 1u);
    EXPECT_EQ(folder.get("buffer/enable"), "0");
    client.reset();
    client.emplace(system, story);
    EXPECT_THAT(story.take(1), ElementsAre("opened")) << "at the next schedule it is tried again";
}

INSTANTIATE_TEST_SUITE_P(
    ErrnoByErrno, IioReadFailures,
    testing::Values(
        std::pair(ENODEV, "default accel_3d at /dev/iio:device0 sends no more: read: No such device"),
        std::pair(EIO, "error accel_3d at /dev/iio:device0 sends no more: read: Input/output error"),
        std::pair(EINVAL, "error accel_3d at /dev/iio:device0 sends no more: read: Invalid argument"),
        std::pair(0, "error accel_3d at /dev/iio:device0 sends no more: read: ended"),
        std::pair(EAGAIN, "error accel_3d at /dev/iio:device0 sends no more: wait: Input/output error")));

TEST_F(IioAccelerometers, ReadyForEverWithNothingToReadIsAFailure) {
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    sensor.failure = EAGAIN;
    sensor.send(0, 0, 1000, 7); // never read
    EXPECT_THAT(story.take(2),
                ElementsAre("closed", "error accel_3d at /dev/iio:device0 sends no more: read: Resource "
                                      "temporarily unavailable"));
    EXPECT_EQ(sensor.reads, 8u);
}

TEST_F(IioAccelerometers, PartOfAScanIsAFailure) {
    make();
    client.emplace(system, story);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    sensor.send(std::vector<std::uint8_t>(25));
    EXPECT_THAT(story.take(2),
                ElementsAre("closed", "error accel_3d at /dev/iio:device0 sends no more: read: Bad message"));
}

} // namespace
} // namespace ZorvaTouch::Linux

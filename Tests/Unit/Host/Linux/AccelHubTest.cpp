#include "Host/Linux/AccelHub.h"

#include "Tests/Unit/Host/Linux/AccelClient.h"
#include "Tests/Unit/Host/Linux/IioFakes.h"
#include "Tests/Unit/Host/Linux/SensorFolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <optional>
#include <stdexcept>
#include <string>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using namespace Tests;

const AccelIdentity kLid{"/dev/iio:device3", "/sys/b/iio:device3", "accel_3d", "accel-display", "display"};

TEST(AccelChoices, AreByNameLabelOrNode) {
    EXPECT_FALSE(AccelChoice::none().fits(kLid));
    EXPECT_TRUE(AccelChoice::any().fits(kLid));
    for (const char *const text : {"accel_3d", "accel-display", "/dev/iio:device3", "iio:device3"})
        EXPECT_TRUE(AccelChoice::named(text).fits(kLid)) << text;
    for (const char *const text : {"", "accel", "display", "/sys/b/iio:device3", "device3", "iio:device30"})
        EXPECT_FALSE(AccelChoice::named(text).fits(kLid)) << text;
}

TEST(AccelChoices, AnEmptyTextIsNoLabel) {
    EXPECT_FALSE(AccelChoice::named("").fits({"/dev/iio:device3", "/sys/b/iio:device3", "", "", ""}));
}

TEST(AccelChoices, AreWrittenAsNoneAnyOrAText) {
    EXPECT_FALSE(AccelChoice::none().fits(kLid));
    EXPECT_TRUE(AccelChoice::any().fits(kLid));
    EXPECT_TRUE(AccelChoice::named("accel_3d").fits(kLid));
    EXPECT_FALSE(AccelChoice::named("None").fits(kLid));
    EXPECT_FALSE(AccelChoice::named("").fits(kLid));
}

/// A hub and two sensors, the first of which is first by its syspath.
class AccelHubs : public testing::Test {
protected:
    void SetUp() override {
        log->minimum = Ports::LogLevel::Default;
        const auto [lower, higher] = std::minmax({folders[0].path(), folders[1].path()});
        first = {"/dev/iio:device7", lower, "accel_3d", "", ""};
        second = {"/dev/iio:device3", higher, "lis3", "accel-base", ""};
    }
    void make(AccelChoice choice) {
        hub.emplace(
            system, std::move(choice), log, [this] { ++changes; },
            [this](const std::string &devnode) {
                if (!refusal.empty())
                    throw std::runtime_error(refusal);
                return (devnode == first.devnode ? firstSensor : secondSensor).opener();
            });
    }
    std::string chosen() const { return hub->chosen() ? hub->chosen()->devnode : "none"; }
    /// How many accelerometers a client finds.
    std::size_t inSystem() const {
        const Ref<ZorvaEventClient> anyone = system->createClient();
        return anyone->table->copyServices(anyone.get(), nullptr, 0);
    }

    Story story;
    const std::shared_ptr<StoryLog> log = std::make_shared<StoryLog>(story);
    std::array<SensorFolder, 2> folders;
    FakeSensor firstSensor{story}, secondSensor{story};
    AccelIdentity first, second;
    const std::shared_ptr<Host::EventSystem> system = Host::EventSystem::create();
    int changes = 0;
    std::string refusal; ///< why none can be made
    std::optional<AccelHub> hub;
    std::optional<AccelClient> client;
};

TEST_F(AccelHubs, HaveNoneUntilOneComes) {
    make(AccelChoice::any());
    EXPECT_EQ(chosen(), "none");
    EXPECT_EQ(inSystem(), 0u);
    hub->onAdded(second);
    EXPECT_EQ(chosen(), second.devnode);
    EXPECT_EQ(inSystem(), 1u);
    EXPECT_EQ(changes, 1);
    EXPECT_THAT(story.take(1), ElementsAre("default lis3 at /dev/iio:device3 is the accelerometer"));
}

TEST_F(AccelHubs, StayWithTheOneTheyHave) {
    make(AccelChoice::any());
    hub->onAdded(second);
    hub->onAdded(first);
    EXPECT_EQ(chosen(), second.devnode);
    EXPECT_EQ(inSystem(), 1u);
    hub->onRemoved(first);
    EXPECT_EQ(chosen(), second.devnode);
    EXPECT_EQ(changes, 1);
}

TEST_F(AccelHubs, TakeTheNextBySyspathWhenOneGoes) {
    AccelIdentity middle = first;
    middle.devnode = "/dev/iio:device0";
    middle.syspath += "/more";
    make(AccelChoice::any());
    hub->onAdded(second);
    hub->onAdded(middle);
    hub->onAdded(first);
    hub->onRemoved(second);
    EXPECT_EQ(chosen(), first.devnode);
    EXPECT_EQ(changes, 2);
    hub->onRemoved(first);
    EXPECT_EQ(chosen(), middle.devnode);
    EXPECT_EQ(changes, 3);
    hub->onRemoved(middle);
    EXPECT_EQ(chosen(), "none");
    EXPECT_EQ(inSystem(), 0u);
    EXPECT_EQ(changes, 3) << "there is nothing to schedule anew for";
}

TEST_F(AccelHubs, TakeOnlyWhatWasChosen) {
    make(AccelChoice::named("accel-base"));
    hub->onAdded(first);
    EXPECT_EQ(chosen(), "none");
    hub->onAdded(second);
    EXPECT_EQ(chosen(), second.devnode);
    hub->onRemoved(second);
    EXPECT_EQ(chosen(), "none");
    EXPECT_EQ(changes, 1);
}

TEST_F(AccelHubs, TakeNoneIfNoneIsToBe) {
    make(AccelChoice::none());
    hub->onAdded(first);
    hub->onAdded(second);
    hub->onRemoved(first);
    EXPECT_EQ(chosen(), "none");
    EXPECT_EQ(inSystem(), 0u);
    EXPECT_EQ(changes, 0);
    EXPECT_THAT(story.take(0), IsEmpty());
}

TEST_F(AccelHubs, AClientHearsWhicheverIsThere) {
    log->minimum = Ports::LogLevel::Error;
    client.emplace(system, story);
    make(AccelChoice::any());
    hub->onAdded(second);
    EXPECT_THAT(story.take(1), ElementsAre("opened"));
    secondSensor.send(1000, 0, 0, 3);
    EXPECT_THAT(story.take(1), ElementsAre("1 0 0 at 3"));
    hub->onAdded(first);
    hub->onRemoved(second);
    // The one that goes is not waited for.
    EXPECT_THAT(story.take(2), testing::UnorderedElementsAre("closed", "opened"));
    firstSensor.send(0, 1000, 0, 4);
    EXPECT_THAT(story.take(1), ElementsAre("0 1 0 at 4"));
    hub.reset();
    EXPECT_THAT(story.take(1), ElementsAre("closed"));
}

TEST_F(AccelHubs, OneThatCannotBeUsedIsALineAndTriedAgainWhenAnotherComes) {
    refusal = "no thread";
    make(AccelChoice::any());
    hub->onAdded(first);
    EXPECT_EQ(chosen(), "none");
    EXPECT_EQ(inSystem(), 0u);
    EXPECT_EQ(changes, 0);
    EXPECT_THAT(story.take(1), ElementsAre("error no samples of accel_3d at /dev/iio:device7: no thread"));
    refusal.clear();
    hub->onAdded(second);
    EXPECT_EQ(chosen(), first.devnode);
    EXPECT_EQ(changes, 1);
}

TEST_F(AccelHubs, MayBeToldOfChangesByNobody) {
    hub.emplace(system, AccelChoice::any(), log, nullptr);
    hub->onAdded(first);
    EXPECT_EQ(chosen(), first.devnode);
}

} // namespace
} // namespace ZorvaTouch::Linux

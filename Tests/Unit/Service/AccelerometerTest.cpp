#include "Shared/HostEvent.h"
#include "Shared/PipelineRecording.h"
#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

namespace ZorvaTouch {
namespace {

using namespace Testing;

class ServiceAccelerometer : public ServiceTest {
protected:
    /// Sends samples at these times, each one handled before the next; X is the number.
    void samples(int first, int last) {
        for (int number = first; number <= last; ++number) {
            platform.testClock.ticks = static_cast<std::uint64_t>(number);
            accelerometer->deliver(static_cast<float>(number), 0, 0, 999'999);
            accelerometer->waitUntilHandled();
        }
    }

    /// The time stamps of the recording's "Accel" metadata, in nanoseconds.
    std::vector<std::uint64_t> recorded() {
        std::vector<std::uint64_t> times;
        const PropertyValue text = get("Recording");
        const PipelineRecording recording(*text.asString(), platform.testClock);
        for (const FrameView view : recording.frames())
            if (const Frame frame = view.toFrame(); frame.type == FrameType::Metadata) {
                EXPECT_EQ(frame.key, "Accel");
                EXPECT_EQ(frame.value.find("X")->toUnsigned(), frame.timestampNs);
                times.push_back(frame.timestampNs);
            }
        return times;
    }

    static std::vector<std::uint64_t> counted(std::uint64_t first, std::uint64_t last) {
        std::vector<std::uint64_t> numbers;
        for (std::uint64_t number = first; number <= last; ++number)
            numbers.push_back(number);
        return numbers;
    }
};

// --- Subscribing -----------------------------------------------------------------------------------------

TEST_F(ServiceAccelerometer, IsAskedForASampleEveryTenMilliseconds) {
    attachAccelerometer();
    run();
    EXPECT_EQ(accelerometer->reportInterval(), 10000.0);
    EXPECT_TRUE(platform.journal.errors().empty());
}

TEST_F(ServiceAccelerometer, IsLetGoOfWithTheThread) {
    attachAccelerometer();
    run();
    EXPECT_EQ(eventSystem->counters().clients, 1u);
    unschedule();
    EXPECT_EQ(eventSystem->counters().clients, 0u);
    schedule();
    EXPECT_EQ(eventSystem->counters().clients, 1u);
}

TEST_F(ServiceAccelerometer, IsMissedOnAHostWithoutEvents) {
    run();
    EXPECT_EQ(platform.journal.errors(),
              (Lines{"Failed to create accel system: createEventClient returned nil"}));
    tap();
    queue->runAll();
    EXPECT_EQ(events.events(), (Lines{"may-begin 1", "tap 1"}));
}

TEST_F(ServiceAccelerometer, IsMissedWhereNoClientCanBeHad) {
    attachAccelerometer();
    start();
    offeredService->refuseEventClients(true);
    setCallback(events);
    schedule();
    EXPECT_EQ(platform.journal.errors(),
              (Lines{"Failed to create accel system: createEventClient returned nil"}));
    tap();
    queue->runAll();
    EXPECT_EQ(events.events(), (Lines{"may-begin 1", "tap 1"}));
}

TEST_F(ServiceAccelerometer, IsMissedWhereThereIsNone) {
    attachAccelerometer();
    accelerometer->unplug();
    run();
    EXPECT_EQ(platform.journal.errors(),
              (Lines{"Failed to create accel system: copyServices returned empty array"}));
    EXPECT_EQ(eventSystem->counters().clients, 0u);
    tap();
    queue->runAll();
    EXPECT_EQ(events.events(), (Lines{"may-begin 1", "tap 1"}));
}

TEST_F(ServiceAccelerometer, OfAnotherUsageIsNone) {
    attachAccelerometer();
    accelerometer->properties().set("PrimaryUsage", 4u);
    run();
    EXPECT_EQ(platform.journal.errors(),
              (Lines{"Failed to create accel system: copyServices returned empty array"}));
}

// --- Samples ---------------------------------------------------------------------------------------------

class ServiceWithSamples : public ServiceAccelerometer {
protected:
    ServiceWithSamples() {
        attachAccelerometer();
        run();
    }
};

TEST_F(ServiceWithSamples, RecordsNoneWithoutATouch) {
    samples(1, 250);
    EXPECT_TRUE(recorded().empty());
}

TEST_F(ServiceWithSamples, RecordsAHundredAndOneWithTheFirstAfterATouch) {
    samples(1, 150);
    image({{'A', 300}});
    EXPECT_TRUE(recorded().empty());
    samples(151, 151);
    EXPECT_EQ(recorded(), counted(51, 151));
}

TEST_F(ServiceWithSamples, RecordsAHundredAfterATouchAndKeepsTheRest) {
    image({{'A', 300}});
    samples(1, 130);
    EXPECT_EQ(recorded(), counted(1, 100));
    image({{'A', 300}});
    image({{'A', 300}});
    image(); // a tap
    samples(131, 131);
    EXPECT_EQ(recorded(), counted(1, 131));
}

TEST_F(ServiceWithSamples, StartsTheCountAfreshWithEveryEvent) {
    image({{'A', 300}});
    samples(1, 70);
    image({{'A', 300}});
    image({{'A', 300}});
    image();
    samples(71, 200);
    EXPECT_EQ(recorded(), counted(1, 170));
}

TEST_F(ServiceWithSamples, RecordsNoneForAResetWithoutATouch) {
    samples(1, 5);
    deliver(Scripted::firmwareReport(0)); // an event, but no digitizer's
    samples(6, 10);
    EXPECT_TRUE(recorded().empty());
}

TEST_F(ServiceWithSamples, RecordsAHundredForAReportWithTwoEvents) {
    image();
    image({{'A', 300}});
    deliver(Scripted::firmwareReport(0)); // cancel and reset
    samples(1, 120);
    EXPECT_EQ(recorded(), counted(1, 100));
}

TEST_F(ServiceWithSamples, RecordsThemThoughTheQueueRefuses) {
    queue->refuse(true);
    image({{'A', 300}});
    samples(1, 3);
    EXPECT_EQ(recorded(), counted(1, 3));
}

TEST_F(ServiceWithSamples, KeepsThemAcrossASchedule) {
    samples(1, 5);
    image({{'A', 300}});
    unschedule();
    schedule();
    samples(6, 6);
    EXPECT_EQ(recorded(), counted(1, 6));
}

TEST_F(ServiceWithSamples, IgnoresEventsOfOtherTypes) {
    image({{'A', 300}});
    accelerometer->deliver(HostEvent::createDigitizer(1, {}, 0));
    accelerometer->deliver(HostEvent::createVendorDefined(2, {}, 0));
    accelerometer->waitUntilHandled();
    EXPECT_EQ(eventSystem->counters().heard, 2u);
    EXPECT_TRUE(recorded().empty());
    EXPECT_TRUE(platform.journal.errors().empty());
}

TEST_F(ServiceWithSamples, HearsNoneWhenItIsUnscheduled) {
    unschedule();
    accelerometer->deliver(1, 2, 3, 0);
    EXPECT_EQ(eventSystem->counters().heard, 0u);
}

} // namespace
} // namespace ZorvaTouch

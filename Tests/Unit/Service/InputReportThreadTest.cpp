#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <stdexcept>

namespace ZorvaTouch {
namespace {

using namespace Testing;

constexpr const char *kNoAccelerometer = "Failed to create accel system: createEventClient returned nil";

class InputReportThread : public ServiceTest {
protected:
    /// "scheduled", or else why not.
    std::string status() {
        const PropertyValue status = get("ServiceStatus");
        const bool isScheduled = status.find("Scheduled") && *status.find("Scheduled") == PropertyValue(true);
        const PropertyValue *const reason = status.find("Reason");
        EXPECT_EQ(isScheduled, reason == nullptr);
        return reason ? *reason->asString() : "scheduled";
    }
};

// --- Its life --------------------------------------------------------------------------------------

TEST_F(InputReportThread, LivesFromScheduleToUnschedule) {
    start();
    platform.journal.clear();
    schedule();
    unschedule();
    EXPECT_EQ(platform.journal.linesOfThis(),
              (Lines{"debug scheduleWithDispatchQueue:", "debug unscheduleWithDispatchQueue:",
                     "debug signalling input report thread to exit",
                     "debug waiting for input report thread to exit", "debug input report thread exited"}));
    EXPECT_EQ(platform.journal.linesOfOthers(),
              (Lines{"debug input report thread start", std::string("error ") + kNoAccelerometer,
                     "debug input report thread end"}));
    EXPECT_EQ(platform.threadsStarted(), 1u);
    platform.waitUntilEnded(1);
}

TEST_F(InputReportThread, RegistersThenSchedulesAndUndoesItInReverse) {
    const auto probe = ProbeDevice::create();
    const auto offered = ProbeService::create(probe.get());
    start(offered.get());
    (*hid)->open(hid, 5);
    schedule();
    EXPECT_EQ(probe->registration().buffer.size(), 512u);
    unschedule();
    (*hid)->close(hid, 6);
    EXPECT_EQ(probe->calls(),
              (Lines{"open 5", "register 512", "schedule kHandleInputReportsRunLoopMode",
                     "unschedule kHandleInputReportsRunLoopMode", "unregister 512", "close 6"}));
    EXPECT_EQ(probe->registration().callback, nullptr);
}

TEST_F(InputReportThread, UnregistersTheSameBuffer) {
    const auto probe = ProbeDevice::create();
    const auto offered = ProbeService::create(probe.get());
    start(offered.get());
    schedule();
    const std::uint8_t *const buffer = probe->registration().buffer.data();
    unschedule();
    EXPECT_EQ(probe->registration().buffer.data(), buffer);
    EXPECT_NE(buffer, nullptr);
}

TEST_F(InputReportThread, IsNotMissedByAnUnscheduleThatFollowsAtOnce) {
    start();
    for (int round = 0; round < 200; ++round) {
        (*hid)->scheduleWithDispatchQueue(hid, queue.get());
        unschedule();
    }
    EXPECT_EQ(platform.threadsStarted(), 200u);
    platform.waitUntilEnded(200);
    EXPECT_EQ(referenceCount(), 1u);
    EXPECT_EQ(queue->references(), 1u);
}

TEST_F(InputReportThread, IsInTheStatusWhenScheduleReturnsUntilUnscheduleDoes) {
    EXPECT_EQ(status(), "unscheduled");
    start();
    for (int round = 0; round < 20; ++round) {
        (*hid)->scheduleWithDispatchQueue(hid, queue.get());
        EXPECT_EQ(status(), "scheduled");
        unschedule();
        EXPECT_EQ(status(), "unscheduled");
    }
}

TEST_F(InputReportThread, IsNotThereForAnUnscheduleWithoutASchedule) {
    start();
    platform.journal.clear();
    unschedule();
    EXPECT_EQ(platform.journal.lines(), (Lines{"debug unscheduleWithDispatchQueue:"}));
}

TEST_F(InputReportThread, EndsBeforeASecondScheduleStartsTheNext) {
    run();
    const auto other = ManualQueue::create();
    (*hid)->scheduleWithDispatchQueue(hid, other.get());
    platform.waitUntilEnded(1);
    platform.waitUntilLooping(2);
    EXPECT_EQ(platform.threadsStarted(), 2u);
    EXPECT_EQ(queue->references(), 1u);
    EXPECT_GT(other->references(), 1u);
    image({{'A', 300}});
    EXPECT_EQ(other->runAll(), 1u);
    EXPECT_EQ(queue->submitted(), 0u);
}

TEST_F(InputReportThread, HoldsTheQueueUntilItIsUnscheduled) {
    run();
    EXPECT_GE(queue->references(), 2u);
    unschedule();
    EXPECT_EQ(queue->references(), 1u);
}

TEST_F(InputReportThread, IsUnscheduledWhateverQueueIsNamed) {
    run();
    (*hid)->unscheduleFromDispatchQueue(hid, nullptr);
    platform.waitUntilEnded(1);
    EXPECT_EQ(queue->references(), 1u);
}

TEST_F(InputReportThread, ServesAServiceWithoutADevice) {
    // No source, so the loop is finished at once.
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    platform.waitUntilEnded(1);
    unschedule();
    EXPECT_EQ(platform.journal.errors(), (Lines{kNoAccelerometer}));
}

TEST_F(InputReportThread, CanBeStartedAgain) {
    run();
    tap();
    unschedule();
    schedule();
    tap();
    queue->runAll();
    EXPECT_EQ(events.events(), (Lines{"may-begin 1", "tap 1", "may-begin 1", "tap 1"}));
}

TEST_F(InputReportThread, LeavesNoHookAndNoCallbackBehind) {
    run();
    tap();
    unschedule();
    EXPECT_EQ(queue->runAll(), 2u);
    device->deliver(Scripted::imageReport(9, 90, Scripted::electrodes({{'A', 300}})), 0);
    EXPECT_EQ(queue->submitted(), 2u);
    EXPECT_EQ(referenceCount(), 1u);
    EXPECT_EQ(device->counters().references, 3u);
}

// --- Priority --------------------------------------------------------------------------------------

TEST_F(InputReportThread, AsksForRoundRobinPriority63) {
    run();
    EXPECT_EQ(platform.priorityAskedFor, 63);
    EXPECT_EQ(platform.journal.errors(), (Lines{kNoAccelerometer}));
}

TEST_F(InputReportThread, RunsWithoutThePriorityThatItIsDenied) {
    platform.priorityError = 1;
    run();
    tap();
    EXPECT_EQ(queue->waiting(), 2u);
    EXPECT_EQ(platform.journal.errors(), (Lines{"pthread_setschedparam failed: 1", kNoAccelerometer}));
}

// --- What cannot be had ----------------------------------------------------------------------------

TEST_F(InputReportThread, ThatCannotBeCreatedLeavesNothingScheduled) {
    start();
    platform.failsThreads = true;
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    EXPECT_EQ(platform.journal.errors(), (Lines{"Failed to start the input report thread: no thread"}));
    EXPECT_EQ(status(), "no thread");
    EXPECT_EQ(queue->references(), 1u);
    EXPECT_EQ(referenceCount(), 1u);
    unschedule();
    EXPECT_EQ(status(), "unscheduled");
    platform.failsThreads = false;
    schedule();
    EXPECT_EQ(status(), "scheduled");
    tap();
    EXPECT_EQ(queue->waiting(), 2u);
}

TEST_F(InputReportThread, WithoutASemaphoreIsNotStarted) {
    start();
    platform.failsSemaphores = true;
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    EXPECT_EQ(platform.journal.errors(), (Lines{"Failed to start the input report thread: no semaphore"}));
    EXPECT_EQ(status(), "no semaphore");
    EXPECT_EQ(platform.threadsStarted(), 0u);
    EXPECT_EQ(queue->references(), 1u);
    unschedule();
}

TEST_F(InputReportThread, WithoutARunLoopEndsAndIsLogged) {
    start();
    platform.failsRunLoops = true;
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    EXPECT_EQ(status(), "no run loop");
    platform.waitUntilEnded(1);
    EXPECT_EQ(platform.journal.errors(), (Lines{"input report thread failed: no run loop"}));
    unschedule();
    EXPECT_EQ(queue->references(), 1u);
    platform.failsRunLoops = false;
    schedule();
    tap();
    EXPECT_EQ(queue->waiting(), 2u);
}

TEST_F(InputReportThread, WhoseLoopThrowsIsLoggedAndCleanedUp) {
    const auto probe = ProbeDevice::create();
    const auto offered = ProbeService::create(probe.get());
    start(offered.get());
    platform.beforePass = [] { throw std::runtime_error("the loop broke"); };
    schedule();
    platform.waitUntilEnded(1);
    EXPECT_EQ(platform.journal.errors(),
              (Lines{kNoAccelerometer, "input report thread failed: the loop broke"}));
    EXPECT_EQ(probe->calls().back(), "unregister 512");
    EXPECT_EQ(status(), "the loop broke");
    unschedule();
    EXPECT_EQ(platform.journal.count("debug input report thread exited"), 1u);
    EXPECT_EQ(status(), "unscheduled");
}

TEST_F(InputReportThread, WhoseLoopThrowsWhatIsNoExceptionIsLoggedAsWell) {
    start();
    platform.beforePass = [] { throw 7; };
    schedule();
    platform.waitUntilEnded(1);
    EXPECT_EQ(status(), "unknown exception");
    unschedule();
    EXPECT_EQ(platform.journal.errors(),
              (Lines{kNoAccelerometer, "input report thread failed: unknown exception"}));
}

// --- A device that disappears ------------------------------------------------------------------------

TEST_F(InputReportThread, EndsWhenTheDeviceIsUnplugged) {
    run();
    tap();
    device->unplug();
    platform.waitUntilEnded(1);
    EXPECT_EQ(platform.journal.count("debug input report thread end"), 1u);
    EXPECT_EQ(status(), "scheduled"); // until the host unschedules it
    unschedule();
    EXPECT_EQ(platform.journal.count("debug input report thread exited"), 1u);
    EXPECT_EQ(queue->runAll(), 2u);
}

TEST_F(InputReportThread, CanBeScheduledAgainWhenTheDeviceIsBack) {
    run();
    device->unplug();
    platform.waitUntilEnded(1);
    device->plug();
    schedule(); // without an unschedule in between
    tap();
    EXPECT_EQ(queue->waiting(), 2u);
}

TEST_F(InputReportThread, LivesOnWithAnAccelerometerWhenTheDeviceIsUnplugged) {
    attachAccelerometer();
    run();
    device->unplug();
    accelerometer->deliver(0, 0, 1, 0); // it is still heard
    accelerometer->waitUntilHandled();
    EXPECT_EQ(eventSystem->counters().heard, 1u);
    EXPECT_EQ(platform.journal.count("debug input report thread end"), 0u);
    unschedule();
    EXPECT_EQ(platform.journal.count("debug input report thread end"), 1u);
}

TEST_F(InputReportThread, ThatHasTheLastReferenceDeletesTheService) {
    run();
    EXPECT_EQ(releaseService(), 1u);
    device->unplug(); // the thread ends, and the service with it
    platform.waitUntilEnded(1);
    EXPECT_EQ(platform.journal.linesOfOthers().back(), "debug dealloc");
    EXPECT_EQ(device->counters().references, 2u);
    EXPECT_EQ(queue->references(), 1u);
}

} // namespace
} // namespace ZorvaTouch

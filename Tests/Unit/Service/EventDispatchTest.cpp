#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <vector>

namespace ZorvaTouch {
namespace {

using namespace Testing;
using Scripted::firmwareReport;
using Points = std::vector<TracePoint>;

class EventDispatch : public ServiceTest {
protected:
    /// A touch in progress and then a device reset: one report with two events.
    void resetDuringATouch() {
        image();
        image({{'A', 300}});
        deliver(firmwareReport(0));
    }

    bool isAnswered = false;
};

// --- What the host gets ------------------------------------------------------------------------------

TEST_F(EventDispatch, CallsTheHostOnItsQueueAndNotBefore) {
    run();
    tap();
    EXPECT_TRUE(events.calls().empty());
    EXPECT_EQ(queue->runAll(), 2u);
    EXPECT_EQ(events.events(), (Lines{"may-begin 1", "tap 1"}));
}

TEST_F(EventDispatch, HandsBackWhatTheHostGave) {
    start();
    int mark = 0;
    setCallback(events, &mark);
    schedule();
    tap();
    queue->runAll();
    ASSERT_EQ(events.calls().size(), 2u);
    for (const EventJournal::Call &call : events.calls()) {
        EXPECT_EQ(call.refcon, &mark);
        EXPECT_EQ(call.sender, hid);
        EXPECT_EQ(call.options, 0u);
    }
}

TEST_F(EventDispatch, SubmitsNothingForAReportWithoutEvents) {
    run();
    image();
    image();
    deliver(firmwareReport(1));
    deliver({9});
    EXPECT_EQ(queue->submitted(), 0u);
}

TEST_F(EventDispatch, KeepsTheEventsOfAReportTogether) {
    run();
    resetDuringATouch();
    EXPECT_EQ(queue->waiting(), 2u); // may-begin; cancel and reset
    queue->runAll();
    EXPECT_EQ(events.events(), (Lines{"may-begin 1", "cancel", "reset"}));
}

TEST_F(EventDispatch, LogsAndTracesTheLanding) {
    run();
    resetDuringATouch();
    platform.journal.clear();
    const std::size_t before = platform.traces.points().size();
    queue->runAll();
    EXPECT_EQ(platform.journal.lines(),
              (Lines{"debug Dispatch 1 event(s) land",
                     R"(default Dispatch event: {"mask":0,"phase":128,"y":1,"frame":2})",
                     "debug Dispatch 2 event(s) land",
                     R"(default Dispatch event: {"mask":0,"phase":8,"y":0,"frame":0})",
                     R"(default Dispatch event: {"vendor":true,"usagePage":65376,"usage":2})"}));
    Points landing = platform.traces.points();
    landing.erase(landing.begin(), landing.begin() + static_cast<std::ptrdiff_t>(before));
    EXPECT_EQ(landing, (Points{{0x2B150184, {1, 0, 0, 0}},
                               {0x2B150188, {11, 128, 0, 0}},
                               {0x2B150184, {2, 0, 0, 0}},
                               {0x2B150188, {11, 8, 0, 0}},
                               {0x2B150188, {1, 0, 0, 0}}}));
}

TEST_F(EventDispatch, LogsDispatchedEventsAtTheDefaultLevel) {
    platform.journal.setLevel(Ports::LogLevel::Default);
    run();
    platform.journal.clear();
    tap();
    queue->runAll();
    EXPECT_EQ(platform.journal.lines(),
              (Lines{R"(default Dispatch event: {"mask":0,"phase":128,"y":1,"frame":1})",
                     R"(default Dispatch event: {"mask":131072,"phase":null,"y":1,"frame":4})"}));
}

// --- What was agreed at schedule ---------------------------------------------------------------------

TEST_F(EventDispatch, TakesANewCallbackAtTheNextSchedule) {
    run();
    EventJournal later;
    setCallback(later);
    tap();
    queue->runAll();
    EXPECT_EQ(events.events(), (Lines{"may-begin 1", "tap 1"}));
    EXPECT_TRUE(later.calls().empty());
    unschedule();
    schedule();
    tap();
    queue->runAll();
    EXPECT_EQ(events.calls().size(), 2u);
    EXPECT_EQ(later.events(), (Lines{"may-begin 1", "tap 1"}));
}

TEST_F(EventDispatch, DeliversAfterUnscheduleWhatWasSubmittedBefore) {
    run();
    tap();
    unschedule();
    EXPECT_EQ(queue->references(), 3u); // the test's and the two batches'
    EXPECT_EQ(queue->runAll(), 2u);
    EXPECT_EQ(events.events(), (Lines{"may-begin 1", "tap 1"}));
    EXPECT_EQ(queue->references(), 1u);
}

TEST_F(EventDispatch, DeliversAfterTheHostsLastReference) {
    run();
    tap();
    unschedule();
    (*plugIn)->Stop(plugIn);
    EXPECT_EQ(releaseService(), 2u); // the two batches
    EXPECT_EQ(queue->runAll(), 2u);
    EXPECT_EQ(events.events(), (Lines{"may-begin 1", "tap 1"}));
    EXPECT_EQ(platform.journal.lines().back(), "debug dealloc");
}

TEST_F(EventDispatch, OfAQueueThatEndsIsDiscarded) {
    auto other = ManualQueue::create();
    start();
    setCallback(events);
    schedule(other.get());
    tap();
    unschedule();
    EXPECT_EQ(referenceCount(), 3u);
    // The batches keep the queue that keeps them: the host discards what is left, as a queue must at its end.
    EXPECT_EQ(other->discardAll(), 2u);
    EXPECT_EQ(referenceCount(), 1u);
    EXPECT_EQ(other->references(), 1u);
    EXPECT_TRUE(events.calls().empty());
}

// --- What is missing or refuses ------------------------------------------------------------------------

TEST_F(EventDispatch, WithoutACallbackOnlyLogsAndTraces) {
    start();
    schedule();
    image({{'A', 300}});
    EXPECT_EQ(queue->runAll(), 1u);
    EXPECT_EQ(platform.traces.pointsOf(0x2B150188), (Points{{0x2B150188, {11, 128, 0, 0}}}));
    EXPECT_EQ(platform.journal.count(R"(default Dispatch event: {"mask":0,"phase":128,"y":1,"frame":1})"),
              1u);
}

TEST_F(EventDispatch, WithoutAQueueDropsTheBatchWithAnErrorLine) {
    start();
    setCallback(events);
    schedule(nullptr);
    platform.journal.clear();
    tap();
    EXPECT_EQ(platform.journal.errors(),
              (Lines{"dispatch failed: there is no queue", "dispatch failed: there is no queue"}));
}

TEST_F(EventDispatch, IntoAQueueThatRefusesDropsTheBatchWithAnErrorLine) {
    run();
    platform.journal.clear();
    queue->refuse(true);
    image({{'A', 300}});
    EXPECT_EQ(platform.journal.errors(), (Lines{"dispatch failed: the queue refused"}));
    EXPECT_EQ(referenceCount(), 2u); // the host's and the thread's: the batch is gone
    queue->refuse(false);
    image({{'A', 300}});
    image({{'A', 300}});
    image();
    queue->runAll();
    EXPECT_EQ(events.events(), (Lines{"tap 1"}));
}

TEST_F(EventDispatch, GoesOnWithTheNextBatchAfterACallbackThatThrows) {
    static int calls;
    calls = 0;
    start();
    (*hid)->setEventCallback(
        hid,
        [](void *, void *, void *, const ZorvaEvent *, std::uint32_t) {
            if (++calls == 1)
                throw std::runtime_error("the host broke");
        },
        nullptr, nullptr);
    schedule();
    platform.journal.clear();
    tap();
    EXPECT_EQ(queue->runAll(), 2u);
    EXPECT_EQ(calls, 2);
    EXPECT_EQ(platform.journal.errors(), (Lines{"delivery failed: the host broke"}));
}

// --- Callbacks that call back --------------------------------------------------------------------------

TEST_F(EventDispatch, LetsTheCallbackCallTheService) {
    start();
    (*hid)->setEventCallback(
        hid,
        [](void *target, void *, void *sender, const ZorvaEvent *, std::uint32_t) {
            const auto table = static_cast<HidServiceInterfaceTable **>(sender);
            (*table)->setProperty(table, "Pipeline.Algs.ActivationThreshold", nullptr);
            *static_cast<bool *>(target) = (*table)->copyProperty(table, "no such property") == nullptr;
            (*table)->unscheduleFromDispatchQueue(table, nullptr);
        },
        &isAnswered, nullptr);
    schedule();
    image({{'A', 300}});
    queue->runAll();
    EXPECT_TRUE(isAnswered);
    platform.waitUntilEnded(1);
}

TEST_F(EventDispatch, LetsTheCallbackGiveTheLastReferenceBack) {
    run();
    unschedule();
    (*hid)->setEventCallback(
        hid,
        [](void *, void *, void *sender, const ZorvaEvent *event, std::uint32_t) {
            const auto table = static_cast<HidServiceInterfaceTable **>(sender);
            EXPECT_EQ((*table)->Release(table), 1u); // the batch's is left
            EXPECT_EQ(event->table->type(event), 11u);
        },
        nullptr, nullptr);
    schedule();
    image({{'A', 300}});
    unschedule();
    plugIn = nullptr;
    EXPECT_EQ(queue->runAll(), 1u);
    EXPECT_EQ(platform.journal.lines().back(), "debug dealloc");
}

} // namespace
} // namespace ZorvaTouch

#include "Host/Simulated/Device.h"

#include "Tests/Unit/Host/Simulated/LoopThread.h"
#include "Tests/Unit/Host/Simulated/ReportLog.h"

#include <gtest/gtest.h>

#include <latch>
#include <optional>
#include <thread>

namespace ZorvaTouch::Simulated {
namespace {

using Host::RunOutcome;

/// A device on a run loop of the system, on a thread of its own.
class DeviceThreads : public testing::Test {
protected:
    void begin() {
        thread.emplace([this](ZorvaRunLoop *loop) { log.begin(*device.get(), loop); },
                       [this](ZorvaRunLoop *loop) { log.end(*device.get(), loop); });
    }
    bool deliver(std::uint8_t id) { return device->deliver(Bytes{id}, id); }

    ReportLog log;
    Ref<Device> device = Device::create();
    std::optional<LoopThread> thread;
};

TEST_F(DeviceThreads, AReportIsHandledOnceTheWaitIsOver) {
    begin();
    for (std::size_t count = 1; count <= 1000; ++count) {
        ASSERT_TRUE(deliver(static_cast<std::uint8_t>(count)));
        device->waitUntilHandled();
        ASSERT_EQ(log.reports.size(), count); // nothing is delivered, so the log is ours
        ASSERT_EQ(device->counters().handled, count);
    }
    thread->stop();
    EXPECT_EQ(log.reports.back().reportId, 1000u % 256);
}

TEST_F(DeviceThreads, AFullQueueIsHandledWhole) {
    begin();
    for (std::uint8_t id = 1; id <= 63; ++id)
        ASSERT_TRUE(deliver(id));
    device->waitUntilHandled();
    EXPECT_EQ(log.reports.size(), 63u);
}

TEST_F(DeviceThreads, AnUnpluggedDeviceEndsItsLoop) {
    begin();
    deliver(1);
    device->waitUntilHandled();
    device->unplug();
    EXPECT_EQ(thread->join(), RunOutcome::Finished);
    EXPECT_FALSE(deliver(2));
    EXPECT_EQ(log.reports.size(), 1u);
}

TEST_F(DeviceThreads, AnUnplugInTheCallbackEndsTheLoop) {
    log.onReport = [this] { device->unplug(); };
    begin();
    deliver(1);
    EXPECT_EQ(thread->join(), RunOutcome::Finished);
    EXPECT_EQ(log.reports.size(), 1u);
    EXPECT_EQ(device->counters().handled, 1u);
}

TEST_F(DeviceThreads, AnUnplugWhileReportsFlowLosesNoneUncounted) {
    constexpr std::uint64_t kReports = 20000;
    begin();
    std::latch hundred(1);
    std::thread sender([&] {
        for (std::uint64_t sent = 1; sent <= kReports; ++sent) {
            deliver(static_cast<std::uint8_t>(sent));
            if (sent == 100)
                hundred.count_down();
        }
    });
    hundred.wait();
    device->unplug();
    device->waitUntilHandled();
    EXPECT_EQ(thread->join(), RunOutcome::Finished);
    sender.join();
    const DeviceCounters counters = device->counters();
    EXPECT_EQ(counters.handled + counters.dropped, kReports);
    EXPECT_EQ(counters.handled, log.reports.size());
}

TEST_F(DeviceThreads, SeveralSendersLoseNothingUncounted) {
    begin();
    const auto send = [this] {
        for (int sent = 0; sent < 2000; ++sent)
            deliver(1);
    };
    std::thread second(send);
    std::thread third(send);
    send();
    second.join();
    third.join();
    device->waitUntilHandled();
    const DeviceCounters counters = device->counters();
    EXPECT_EQ(counters.handled + counters.dropped, 6000u);
    thread->stop();
    EXPECT_EQ(counters.handled, log.reports.size());
}

TEST_F(DeviceThreads, AWaitEndsWithTheSourceEvenIfTheCallbackDoesNot) {
    std::latch begun(1);
    std::latch mayEnd(1);
    log.onReport = [&] {
        begun.count_down();
        mayEnd.wait();
    };
    begin();
    deliver(1);
    deliver(2);
    begun.wait();
    std::thread waiting([this] { device->waitUntilHandled(); });
    device->unplug();
    waiting.join();
    EXPECT_EQ(device->counters().handled, 0u);
    mayEnd.count_down();
    EXPECT_EQ(thread->join(), RunOutcome::Finished);
    EXPECT_EQ(device->counters().handled, 1u);
    EXPECT_EQ(device->counters().dropped, 1u);
}

TEST_F(DeviceThreads, AWaitEndsWhenTheCallbackUnschedulesTheDevice) {
    ZorvaRunLoop *place = nullptr;
    std::latch mayEnd(1);
    log.onReport = [&] {
        mayEnd.wait();
        log.end(*device.get(), place);
    };
    thread.emplace(
        [&](ZorvaRunLoop *loop) {
            place = loop;
            log.begin(*device.get(), loop);
        },
        [](ZorvaRunLoop *) {});
    deliver(1);
    deliver(2);
    std::thread waiting([this] { device->waitUntilHandled(); });
    mayEnd.count_down();
    waiting.join();
    EXPECT_EQ(thread->join(), RunOutcome::Finished);
    EXPECT_EQ(log.reports.size(), 1u);
    EXPECT_EQ(device->counters().dropped, 0u) << "the second one waits for the next schedule";
}

TEST_F(DeviceThreads, APluggedDeviceServesAnotherLoop) {
    begin();
    device->unplug();
    thread->join();
    device->plug();
    begin();
    deliver(5);
    device->waitUntilHandled();
    thread->stop();
    EXPECT_EQ(log.reports.back().reportId, 5u);
}

} // namespace
} // namespace ZorvaTouch::Simulated

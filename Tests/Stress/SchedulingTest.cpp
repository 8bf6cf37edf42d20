#include "Host/Runtime/SerialQueue.h"
#include "Service/ZorvaTouchHIDService.h"
#include "Tests/Support/SensorSequence.h"
#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <stop_token>
#include <thread>

namespace ZorvaTouch {
namespace {

using namespace Testing;

constexpr int kCycles = 1000;

void advance(std::atomic<int> &moment) {
    ++moment;
    moment.notify_one();
}

class StressOfScheduling : public ServiceTest {
protected:
    StressOfScheduling() { platform.journal.setLevel(Ports::LogLevel::Error); }

    void scheduleAtOnce() { (*hid)->scheduleWithDispatchQueue(hid, serialQueue.boundary()); }

    Host::SerialQueue serialQueue{"stress-events"};
};

TEST_F(StressOfScheduling, ComesAndGoesAThousandTimesUnderReports) {
    start();
    setCallback(events);
    {
        const std::jthread reports([this](const std::stop_token &stop) {
            for (std::uint32_t number = 1; !stop.stop_requested(); ++number) {
                device->deliver(
                    Scripted::imageReport(
                        number, 10 * number,
                        Scripted::electrodes({{'A', static_cast<std::int16_t>(number % 8 < 4 ? 300 : 0)}})),
                    0);
                std::this_thread::yield();
            }
        });
        for (int cycle = 0; cycle < kCycles; ++cycle) {
            scheduleAtOnce();
            if (cycle % 3 == 0)
                device->waitUntilHandled();
            unschedule();
        }
    }
    serialQueue.drain();
    EXPECT_EQ(platform.threadsStarted(), 1000u);
    EXPECT_EQ(referenceCount(), 1u);
    EXPECT_EQ(device->counters().references, 3u);
}

TEST_F(StressOfScheduling, SchedulesAgainAndAgainWithoutAnUnschedule) {
    start();
    for (int cycle = 0; cycle < kCycles; ++cycle)
        scheduleAtOnce();
    unschedule();
    platform.waitUntilEnded(1000);
    EXPECT_EQ(referenceCount(), 1u);
}

TEST_F(StressOfScheduling, LosesItsDeviceAtAnyMoment) {
    Scripted::Dice dice(6);
    start();
    setCallback(events);
    std::atomic<int> moment = 0;
    std::atomic<bool> isOver = false;
    {
        const std::jthread unplugger([&] {
            for (int seen = 0; !isOver;) {
                moment.wait(seen);
                seen = moment;
                device->unplug();
            }
        });
        for (int cycle = 0; cycle < kCycles / 2; ++cycle) {
            device->plug();
            if (dice.onceIn(2))
                advance(moment);
            scheduleAtOnce();
            const int reports = dice.between(0, 6);
            for (int report = 0; report < reports; ++report)
                device->deliver(Scripted::firmwareReport(0), 0);
            if (dice.onceIn(2))
                device->waitUntilHandled();
            advance(moment);
            unschedule();
        }
        isOver = true;
        advance(moment);
    }
    serialQueue.drain();
    EXPECT_EQ(referenceCount(), 1u);
}

TEST_F(StressOfScheduling, IsReleasedByTheQueueOrTheThreadWhicheverIsLast) {
    constexpr std::size_t kServices = 300;
    Scripted::Dice dice(7);
    platform.journal.setLevel(Ports::LogLevel::Debug);
    for (std::size_t number = 0; number < kServices; ++number) {
        auto &service = *new ZorvaTouchHIDService(platform);
        PlugInInterfaceTable **const first = service.getPluginInterface();
        HidServiceInterfaceTable **const second = service.getServiceInterface();
        const auto other = Simulated::Device::create();
        const auto offered = Host::Service::create(other);
        (*first)->Start(first, nullptr, offered.get());
        (*second)->setEventCallback(second, EventJournal::receive, &events, nullptr);
        (*second)->scheduleWithDispatchQueue(second, serialQueue.boundary());
        const int reports = dice.between(0, 5);
        for (int report = 0; report < reports; ++report)
            other->deliver(Scripted::firmwareReport(0), 0);
        if (dice.onceIn(2))
            (*second)->unscheduleFromDispatchQueue(second, nullptr);
        (*first)->Release(first); // scheduled or not, and batches may still be on their way
        other->unplug();          // the thread of a service that was released ends with its device
    }
    platform.waitUntilEnded(kServices);
    serialQueue.drain();
    EXPECT_EQ(platform.journal.count("debug dealloc"), kServices);
}

} // namespace
} // namespace ZorvaTouch

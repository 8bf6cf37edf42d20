#include "Host/Objects/Accelerometer.h"
#include "Host/Runtime/SerialQueue.h"
#include "Plugin/ValueObject.h"
#include "Shared/Pipeline.h"
#include "Tests/Support/SensorSequence.h"
#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <chrono>
#include <cstdint>
#include <semaphore>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace ZorvaTouch {
namespace {

using namespace Testing;

constexpr int kReports = 10'000; ///< one second at 10 kHz
constexpr std::chrono::microseconds kPeriod{100};

/// The reports of a sensor with busy fingers.
std::vector<Bytes> busyReports(std::uint64_t seed) {
    Scripted::SensorSequence sensor(seed);
    std::vector<Bytes> reports;
    for (int index = 0; index < kReports; ++index) {
        const auto report = sensor.next().toReport();
        reports.emplace_back(report.begin(), report.end());
    }
    return reports;
}

/// What a recognizer by itself makes of them.
Lines eventsOf(const std::vector<Bytes> &reports) {
    Lines events;
    Pipeline pipeline(Ports::silentLogProvider());
    pipeline.onHIDEvents = [&](std::uint64_t, const HostEventList &batch) {
        for (const auto &event : batch)
            events.push_back(Scripted::eventText(*event));
    };
    for (const Bytes &report : reports)
        pipeline.handleInputReport(0, report.data(), report.size());
    return events;
}

class StressOfReports : public ServiceTest {
protected:
    StressOfReports() {
        platform.journal.setLevel(Ports::LogLevel::Error);
        attachAccelerometer();
    }
    ~StressOfReports() override {
        // Before the queue goes: it discards what is left.
        if (plugIn)
            unschedule();
        serialQueue.drain();
    }

    void runOnSerialQueue() {
        start();
        setCallback(events);
        schedule(serialQueue.boundary());
    }

    /// At the device's pace, or as fast as the service takes them if that is slower: none is lost.
    void deliverAll(const std::vector<Bytes> &reports) {
        auto due = std::chrono::steady_clock::now();
        for (const Bytes &report : reports) {
            std::this_thread::sleep_until(due += kPeriod);
            if (!device->deliver(report, 0)) {
                device->waitUntilHandled();
                ASSERT_TRUE(device->deliver(report, 0));
            }
        }
        device->waitUntilHandled();
        serialQueue.drain();
    }

    Host::SerialQueue serialQueue{"stress-events"};
};

/// Does something over and over on a thread of its own until it goes out of scope.
class Meanwhile {
public:
    template <typename Work>
    explicit Meanwhile(Work work)
        : _thread([work = std::move(work)](const std::stop_token &stop) {
              while (!stop.stop_requested())
                  work();
          }) {}

private:
    std::jthread _thread;
};

TEST_F(StressOfReports, DeliversWhatTheRecognizerMakesInOrder) {
    const std::vector<Bytes> reports = busyReports(1);
    const Lines expected = eventsOf(reports);
    ASSERT_GT(expected.size(), 100u);
    runOnSerialQueue();
    deliverAll(reports);
    EXPECT_EQ(events.events(), expected);
}

TEST_F(StressOfReports, IsReadAndWrittenByFourThreadsMeanwhile) {
    const std::vector<Bytes> reports = busyReports(2);
    const Lines expected = eventsOf(reports);
    runOnSerialQueue();
    std::atomic<std::uint64_t> rounds = 0;
    {
        const auto threshold = makeValue(200.0); // what it is: the events stay the same
        const auto readAndWrite = [&] {
            EXPECT_EQ((*hid)->setProperty(hid, "Pipeline.Algs.ActivationThreshold", threshold.get()), 1);
            EXPECT_EQ((*hid)->setProperty(hid, "Product", threshold.get()), 1);
            for (const char *key :
                 {"Version", "FirmwareDebugReports", "FactoryResetHoldDuration", "Product",
                  "Pipeline.DebugInfo", "Pipeline.Algs.DebugInfo", "Pipeline.Algs.ActivationThreshold"})
                EXPECT_TRUE(Ref<const ZorvaValue>::adopt((*hid)->copyProperty(hid, key))) << key;
            ++rounds;
            std::this_thread::yield();
        };
        const std::array<Meanwhile, 4> threads{Meanwhile(readAndWrite), Meanwhile(readAndWrite),
                                               Meanwhile(readAndWrite), Meanwhile(readAndWrite)};
        deliverAll(reports);
    }
    EXPECT_GT(rounds, 0u);
    EXPECT_EQ(events.events(), expected);
    EXPECT_TRUE(platform.journal.errors().empty());
}

TEST_F(StressOfReports, IsRecordedAndReadInALoopMeanwhile) {
    const std::vector<Bytes> reports = busyReports(3);
    const Lines expected = eventsOf(reports);
    runOnSerialQueue();
    std::atomic<int> readings = 0;
    {
        const Meanwhile reader([&] {
            const auto text = Ref<const ZorvaValue>::adopt((*hid)->copyProperty(hid, "Recording"));
            ASSERT_TRUE(text);
            EXPECT_EQ(text->table->kind(text.get()), static_cast<std::uint32_t>(kZorvaValueString));
            ++readings;
        });
        deliverAll(reports);
    }
    EXPECT_GT(readings, 0);
    EXPECT_EQ(events.events(), expected);
}

TEST_F(StressOfReports, SharesItsThreadWithTheAccelerometer) {
    const std::vector<Bytes> reports = busyReports(4);
    const Lines expected = eventsOf(reports);
    runOnSerialQueue();
    {
        const Meanwhile motion([&] {
            accelerometer->deliver(0, 0, 1, 0);
            accelerometer->waitUntilHandled();
        });
        deliverAll(reports);
    }
    EXPECT_GT(eventSystem->counters().heard, 0u);
    EXPECT_EQ(events.events(), expected);
}

TEST_F(StressOfReports, GoesOnWhileTheHostsCallbackBlocks) {
    struct Target {
        std::binary_semaphore mayGoOn{0};
        std::atomic<int> calls = 0;
    } target;
    start();
    (*hid)->setEventCallback(
        hid,
        [](void *context, void *, void *, const ZorvaEvent *, std::uint32_t) {
            auto &self = *static_cast<Target *>(context);
            if (self.calls++ == 0)
                self.mayGoOn.acquire();
        },
        &target, nullptr);
    schedule(serialQueue.boundary());
    for (int number = 0; number < 50; ++number)
        tap(); // returns when the input thread has handled each report
    EXPECT_EQ(device->counters().handled, 200u);
    EXPECT_LE(target.calls, 1);
    target.mayGoOn.release();
    serialQueue.drain();
    EXPECT_EQ(target.calls, 100);
}

TEST_F(StressOfReports, LetsEveryCallbackCallBackIntoTheService) {
    const std::vector<Bytes> reports = busyReports(5);
    const Lines expected = eventsOf(reports);
    std::atomic<std::size_t> calls = 0;
    start();
    (*hid)->setEventCallback(
        hid,
        [](void *target, void *, void *sender, const ZorvaEvent *event, std::uint32_t) {
            const auto table = static_cast<HidServiceInterfaceTable **>(sender);
            (*table)->AddRef(table);
            EXPECT_TRUE(Ref<const ZorvaValue>::adopt((*table)->copyProperty(table, "Pipeline.DebugInfo")));
            (*table)->setProperty(table, "Pipeline.Note", nullptr);
            EXPECT_EQ((*table)->setOutputEvent(table, event), ZORVA_STATUS_UNSUPPORTED);
            EXPECT_GT((*table)->Release(table), 0u);
            ++*static_cast<std::atomic<std::size_t> *>(target);
        },
        &calls, nullptr);
    schedule(serialQueue.boundary());
    deliverAll(reports);
    EXPECT_EQ(calls, expected.size());
}

} // namespace
} // namespace ZorvaTouch

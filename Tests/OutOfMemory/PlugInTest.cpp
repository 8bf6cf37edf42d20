#include "Bench/SampleReports.h"
#include "Host/Runtime/PlugInFile.h"
#include "Plugin/EventObject.h"
#include "Plugin/ValueObject.h"
#include "Shared/RecordingContainer.h"
#include "Tests/OutOfMemory/FrugalHost.h"
#include "Tests/OutOfMemory/Refusal.h"

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <cstdlib>
#include <functional>
#include <span>
#include <string>
#include <utility>
#include <vector>

// The plug-in's file is loaded and driven through its tables, and each allocation inside of it is refused in
// turn.

namespace ZorvaTouch {
namespace {

using Testing::forEachRefusal;
using Testing::Refusal;

const std::string kLongText(1000, 't');
const std::array<std::uint8_t, 10> kDeviceReset{2, 0};
const std::vector<std::uint8_t> kLongReport(500, 9);

/// The loaded file, in a process with a platform that counts errors.
class LoadedFile {
public:
    LoadedFile() { Host::setProcessPlatform(&platform); }
    ~LoadedFile() { Host::setProcessPlatform(nullptr); }
    LoadedFile(const LoadedFile &) = delete;
    LoadedFile &operator=(const LoadedFile &) = delete;

    [[nodiscard]] PlugInInterfaceTable **make() const {
        return static_cast<PlugInInterfaceTable **>(_factory(nullptr, kZorvaHidServicePlugInType));
    }

    Testing::FrugalPlatform platform;

private:
    const Host::PlugInFile _file{ZORVA_TEST_PLUGIN};
    const ZorvaPlugInFactory _factory = _file.factory("ZorvaTouchHIDServiceFactory");
};

class PlugInOutOfMemory : public ::testing::Test {
protected:
    PlugInOutOfMemory() {
        device->property = deviceText.get();
        client->found = offered.get();
        EXPECT_EQ((*plugIn)->Start(plugIn, nullptr, offered.get()), ZORVA_STATUS_SUCCESS);
        EXPECT_EQ(
            (*plugIn)->QueryInterface(plugIn, kZorvaHidServiceInterface, reinterpret_cast<void **>(&hid)),
            ZORVA_STATUS_SUCCESS);
        EXPECT_EQ((*hid)->open(hid, 0), 1);
        (*hid)->setEventCallback(hid, countEvent, &events, nullptr);
    }
    ~PlugInOutOfMemory() override {
        (*hid)->unscheduleFromDispatchQueue(hid, queue.get());
        queue->runAll();
        (*hid)->close(hid, 0);
        EXPECT_EQ((*plugIn)->Stop(plugIn), ZORVA_STATUS_SUCCESS);
        EXPECT_EQ((*hid)->Release(hid), 1u);
        EXPECT_EQ((*plugIn)->Release(plugIn), 0u);
    }

    static void countEvent(void *target, void *, void *, const ZorvaEvent *, std::uint32_t) {
        ++*static_cast<std::atomic<int> *>(target);
    }

    /// Delivers a report, refused memory if there is a refusal.
    void deliver(std::span<const std::uint8_t> report, Refusal *refusal = nullptr) {
        device->deliver(report, [refusal](const std::function<void()> &deliver) {
            if (refusal)
                refusal->during(deliver);
            else
                deliver();
        });
    }

    [[nodiscard]] PropertyValue property(const char *key) {
        return readValue(Ref<const ZorvaValue>::adopt((*hid)->copyProperty(hid, key)).get());
    }
    /// The recorded frames; also says that the recording can be written and read.
    [[nodiscard]] std::vector<Frame> frames() {
        const PropertyValue text = property("Recording");
        std::vector<Frame> read;
        for (const FrameView frame : readRecordingContainer(*text.asString()).frames)
            read.push_back(frame.toFrame());
        return read;
    }

    /// Device resets give an event each: whether the whole way works.
    void expectWorking() {
        queue->runAll();
        const int before = events;
        deliver(kDeviceReset);
        EXPECT_EQ(queue->runAll(), 1u);
        EXPECT_GT(events, before);
    }

    LoadedFile file;
    const Ref<const ZorvaValue> deviceText = makeValue(kLongText);
    const Ref<Testing::FrugalDevice> device = Testing::FrugalDevice::create();
    const Ref<Testing::FrugalEventClient> client = Testing::FrugalEventClient::create();
    const Ref<Testing::FrugalService> offered = Testing::FrugalService::create(*device.get(), *client.get());
    const Ref<Testing::FrugalQueue> queue = Testing::FrugalQueue::create();
    std::atomic<int> events = 0;
    PlugInInterfaceTable **plugIn = file.make();
    HidServiceInterfaceTable **hid = nullptr;
};

TEST_F(PlugInOutOfMemory, TheFactoryMakesAServiceOrNone) {
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  PlugInInterfaceTable **const made = refusal.during([&] { return file.make(); });
                  EXPECT_TRUE(made || refusal.hasHappened());
                  if (made) {
                      EXPECT_EQ((*made)->Release(made), 0u);
                  }
              }),
              0u);
}

TEST_F(PlugInOutOfMemory, TheFactoryMakesTheSystemsPlatformOrNoService) {
    // In a process of its own, where nothing has asked for the platform yet.
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(
        {
            Host::setProcessPlatform(nullptr);
            std::uint64_t none = 0;
            forEachRefusal([&](Refusal &refusal) {
                PlugInInterfaceTable **const made = refusal.during([&] { return file.make(); });
                none += made == nullptr;
                if (made)
                    (*made)->Release(made);
            });
            std::_Exit(none > 0 ? 0 : 1);
        },
        ::testing::ExitedWithCode(0), "");
}

TEST_F(PlugInOutOfMemory, StartIsDoneOrRefused) {
    forEachRefusal([&](Refusal &refusal) {
        const ZorvaStatus status =
            refusal.during([&] { return (*plugIn)->Start(plugIn, nullptr, offered.get()); });
        EXPECT_EQ(status, ZORVA_STATUS_SUCCESS);
    });
}

TEST_F(PlugInOutOfMemory, AValueIsWholeOrNull) {
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    deliver(kLongReport);
    ASSERT_EQ((*hid)->setProperty(hid, "Pipeline.Note", makeValue(kLongText).get()), 1);
    for (const char *key :
         {"Version", "FirmwareDebugReports", "FactoryResetHoldDuration", "Recording", "Product",
          "Pipeline.Algs.ActivationThreshold", "Pipeline.DebugInfo", "Pipeline.Algs.DebugInfo"}) {
        SCOPED_TRACE(key);
        const PropertyValue whole = property(key);
        ASSERT_FALSE(whole.isNull());
        EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                      const std::uint64_t errorsBefore = file.platform.counted.errors();
                      const auto value = Ref<const ZorvaValue>::adopt(
                          refusal.during([&] { return (*hid)->copyProperty(hid, key); }));
                      if (value) {
                          EXPECT_EQ(readValue(value.get()), whole);
                      } else {
                          EXPECT_TRUE(refusal.hasHappened());
                          EXPECT_EQ(file.platform.counted.errors(), errorsBefore + 1);
                      }
                  }),
                  0u);
    }
    expectWorking();
}

TEST_F(PlugInOutOfMemory, TheDebugValueHasWholePartsOrIsNull) {
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    deliver(kLongReport);
    const PropertyValue whole = property("ServicePluginDebug");
    ASSERT_EQ(whole.asDictionary()->size(), 5u);
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  const std::uint64_t errorsBefore = file.platform.counted.errors();
                  const auto value = Ref<const ZorvaValue>::adopt(
                      refusal.during([&] { return (*hid)->copyProperty(hid, "ServicePluginDebug"); }));
                  if (!value) {
                      EXPECT_TRUE(refusal.hasHappened());
                      return;
                  }
                  const PropertyValue read = readValue(value.get());
                  for (const auto &[key, part] : *read.asDictionary())
                      EXPECT_EQ(part, *whole.find(key)) << key;
                  // The recording alone may be missing, since it is null by itself, with a record of its own.
                  const bool isWhole = read.asDictionary()->size() == 5;
                  EXPECT_TRUE(isWhole || (read.asDictionary()->size() == 4 && !read.find("Recording")));
                  EXPECT_EQ(file.platform.counted.errors(), errorsBefore + (isWhole ? 0 : 1));
              }),
              0u);
    expectWorking();
}

TEST_F(PlugInOutOfMemory, AWriteToAStateIsRecordedWhollyOrNotAtAll) {
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    const auto text = makeValue(kLongText);
    const auto number = makeValue(300.0);
    struct Write {
        const char *key;
        const ZorvaValue *value;
    };
    for (const Write &write : {Write{"Pipeline.Algs.ActivationThreshold", number.get()},
                               Write{"Pipeline.A key that is longer than a short string", text.get()}}) {
        EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                      deliver(kLongReport); // or the next write would take this one's place
                      const std::vector<Frame> before = frames();
                      const bool isDone = refusal.during([&] {
                          return (*hid)->setProperty(hid, write.key, write.value);
                      }) != 0;
                      const std::vector<Frame> after = frames();
                      EXPECT_TRUE(isDone || refusal.hasHappened());
                      // What was recorded and then failed in the pipeline is in the recording, too.
                      const bool isRecorded = after.size() == before.size() + 1;
                      EXPECT_TRUE(isRecorded || (!isDone && after == before));
                      if (isRecorded) {
                          EXPECT_EQ(after.back().key, std::string_view(write.key).substr(9));
                          EXPECT_EQ(after.back().value, readValue(write.value));
                      }
                  }),
                  0u);
    }
    expectWorking();
}

TEST_F(PlugInOutOfMemory, AWriteToTheDeviceReachesItOrNot) {
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  const std::uint64_t before = device->propertyWrites;
                  const bool isDone = refusal.during([&] {
                      return (*hid)->setProperty(hid, "Product", deviceText.get());
                  }) != 0;
                  EXPECT_EQ(device->propertyWrites, before + (isDone ? 1 : 0));
                  EXPECT_TRUE(isDone || refusal.hasHappened());
              }),
              0u);
}

TEST_F(PlugInOutOfMemory, AReportIsDroppedAtMostAndTheThreadLivesOn) {
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    std::uint64_t refusals = 0;
    for (const std::vector<std::uint8_t> &report :
         {kLongReport, std::vector<std::uint8_t>(kDeviceReset.begin(), kDeviceReset.end()), {7}})
        refusals += forEachRefusal([&](Refusal &refusal) {
            const std::vector<Frame> before = frames();
            deliver(report, &refusal);
            std::vector<Frame> after = frames();
            if (after.size() != before.size()) {
                EXPECT_EQ(after.back().data, report);
                after.pop_back();
            } else {
                EXPECT_TRUE(refusal.hasHappened());
            }
            EXPECT_EQ(after, before);
        });
    EXPECT_GT(refusals, 0u);
    expectWorking();
}

TEST_F(PlugInOutOfMemory, TouchesDoNotEndTheThread) {
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    std::uint64_t refusals = 0;
    for (const Bench::Report &report : Bench::makeReports(Bench::Stimulus::Taps, 30)) // a tap
        refusals += forEachRefusal([&](Refusal &refusal) {
            deliver(report, &refusal);
            queue->runAll();
        });
    EXPECT_GT(refusals, 0u);
    EXPECT_GT(events, 0);
    EXPECT_GE(frames().size(), 60u);
    expectWorking();
}

TEST_F(PlugInOutOfMemory, AnAccelerometerSampleIsRecordedWhollyOrNotAtAll) {
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    for (const Bench::Report &report : Bench::makeReports(Bench::Stimulus::Taps, 20))
        deliver(report); // a touch begins: the next hundred samples are recorded
    const auto sample = makeEvent(HostEvent::createAccelerometer(0, {.x = 0.25f, .y = -0.5f, .z = 1.0f}, 0));
    const PropertyValue recorded = PropertyValue::Dictionary{{"X", 0.25}, {"Y", -0.5}, {"Z", 1.0}};
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  const std::vector<Frame> before = frames();
                  device->deliver(kLongReport, [&](const std::function<void()> &) {
                      refusal.during([&] { client->send(sample.get()); });
                  });
                  std::vector<Frame> after = frames();
                  if (after.size() != before.size()) {
                      EXPECT_EQ(after.back().key, "Accel");
                      EXPECT_EQ(after.back().value, recorded);
                      after.pop_back();
                  } else {
                      EXPECT_TRUE(refusal.hasHappened());
                  }
                  EXPECT_EQ(after, before);
              }),
              0u);
    expectWorking();
}

TEST_F(PlugInOutOfMemory, AnEventIsDeliveredOrDropped) {
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  deliver(kDeviceReset);
                  const int before = events;
                  EXPECT_EQ(refusal.during([&] { return queue->runAll(); }), 1u);
                  EXPECT_TRUE(events == before + 1 || (events == before && refusal.hasHappened()));
              }),
              0u);
    expectWorking();
}

TEST_F(PlugInOutOfMemory, AServiceThatCannotBeScheduledCanBeLater) {
    // All threads: the input thread makes its loop and schedules the device while the host waits.
    const std::uint64_t refusals = forEachRefusal([&](Refusal &refusal) {
        refusal.during(
            [&] {
                (*hid)->scheduleWithDispatchQueue(hid, queue.get());
                (*hid)->unscheduleFromDispatchQueue(hid, queue.get());
            },
            Refusal::Threads::All);
    });
    EXPECT_GT(refusals, 0u);
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    expectWorking();
}

} // namespace
} // namespace ZorvaTouch

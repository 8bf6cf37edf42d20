#include "Host/Runtime/SerialQueue.h"
#include "Plugin/ValueObject.h"
#include "Tests/Support/SensorSequence.h"
#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>
#include <string>
#include <vector>

namespace ZorvaTouch {
namespace {

using namespace Testing;

constexpr int kCalls = 3000;

/// A host that calls anything at any time, with nothing or with nonsense. What it does depends on the seed
/// alone; that it comes out whole is the test.
class HostileHost : public ServiceTest {
protected:
    HostileHost() {
        platform.journal.setLevel(Ports::LogLevel::Error);
        offeredService = Host::Service::create(device);
    }
    ~HostileHost() override {
        if (plugIn)
            unschedule();
        serialQueue.drain();
    }

    void callSomething() {
        switch (dice.between(0, 13)) {
        case 0:
            return useIdentifiers();
        case 1:
            (*plugIn)->Probe(plugIn, nullptr, nullptr, nullptr);
            return;
        case 2:
            (*plugIn)->Start(plugIn, nullptr, dice.onceIn(2) ? nullptr : offeredService.get());
            return;
        case 3: // also while it is scheduled, and twice
            (*plugIn)->Stop(plugIn);
            (*plugIn)->Stop(plugIn);
            return;
        case 4:
            (*hid)->open(hid, dice.bits());
            return;
        case 5:
            (*hid)->close(hid, dice.bits());
            return;
        case 6:
        case 7:
            return readSomething();
        case 8:
            return writeSomething();
        case 9:
            (*hid)->setEventCallback(hid, dice.onceIn(2) ? nullptr : EventJournal::receive, &events, nullptr);
            return;
        case 10:
            (*hid)->scheduleWithDispatchQueue(hid, dice.onceIn(3) ? nullptr : serialQueue.boundary());
            return;
        case 11:
            (*hid)->unscheduleFromDispatchQueue(hid, dice.onceIn(2) ? nullptr : serialQueue.boundary());
            return;
        case 12:
            (*hid)->copyEvent(hid, dice.bits(), nullptr, dice.bits());
            (*hid)->setOutputEvent(hid, nullptr);
            return;
        default:
            return deliverSomething();
        }
    }

    void useIdentifiers() {
        ZorvaUuid identifier = dice.onceIn(2) ? kZorvaPlugInInterface : kZorvaHidServiceInterface;
        const bool isWrong = dice.onceIn(2);
        if (isWrong)
            identifier.bytes[dice.between(0, 15)] ^= 1;
        void *found = nullptr;
        EXPECT_EQ((*plugIn)->QueryInterface(plugIn, identifier, nullptr), ZORVA_STATUS_NO_INTERFACE);
        EXPECT_EQ((*hid)->QueryInterface(hid, identifier, &found),
                  isWrong ? ZORVA_STATUS_NO_INTERFACE : ZORVA_STATUS_SUCCESS);
        EXPECT_EQ(found == nullptr, isWrong);
        if (found)
            (*hid)->Release(hid);
    }

    const char *anyKey() {
        static constexpr const char *kKeys[] = {nullptr,
                                                "",
                                                ".",
                                                "Pipeline",
                                                "Pipeline.",
                                                "Pipeline..",
                                                "Pipeline.Algs.",
                                                "Pipeline.Algs.ActivationThreshold",
                                                "Pipeline.Algs.HoldTimeoutMilliseconds",
                                                "Pipeline.Algs.VirtualNormalizationFactor99999999999",
                                                "Pipeline.DebugInfo",
                                                "Version",
                                                "Recording",
                                                "ServicePluginDebug",
                                                "ServiceStatus",
                                                "FirmwareDebugReports",
                                                "\xFF\xFE\x01",
                                                "%s%n{}"};
        return kKeys[dice.between(0, static_cast<int>(std::size(kKeys)) - 1)];
    }

    void readSomething() {
        const auto value = Ref<const ZorvaValue>::adopt((*hid)->copyProperty(hid, anyKey()));
        static_cast<void>(readValue(value.get()));
    }

    void writeSomething() {
        const std::vector<PropertyValue> values{
            PropertyValue(),
            std::numeric_limits<double>::quiet_NaN(),
            -std::numeric_limits<double>::infinity(),
            std::numeric_limits<std::uint64_t>::max(),
            std::string("{}%n\0", 5),
            PropertyValue::Bytes(3),
            PropertyValue::Array{PropertyValue()},
            PropertyValue::Dictionary{{"", true}},
        };
        const auto value = makeValue(values[static_cast<std::size_t>(dice.between(0, 7))]);
        (*hid)->setProperty(hid, anyKey(), dice.onceIn(5) ? nullptr : value.get());
    }

    void deliverSomething() {
        Bytes report(static_cast<std::size_t>(dice.between(0, 600)));
        for (std::uint8_t &byte : report)
            byte = static_cast<std::uint8_t>(dice.bits());
        if (!report.empty())
            report[0] = static_cast<std::uint8_t>(dice.between(0, 3));
        device->deliver(report, dice.bits());
        if (dice.onceIn(8))
            dice.onceIn(2) ? device->unplug() : device->plug();
    }

    Scripted::Dice dice{11};
    Host::SerialQueue serialQueue{"stress-events"};
};

TEST_F(HostileHost, IsSurvivedWhateverItCalls) {
    for (int call = 0; call < kCalls; ++call)
        callSomething();
    unschedule();
    serialQueue.drain();
    EXPECT_EQ(referenceCount(), 1u);
}

TEST_F(HostileHost, IsSurvivedWhenItLeavesInTheMidst) {
    for (int round = 0; round < 30; ++round) {
        for (int call = 0; call < 20; ++call)
            callSomething();
        (*hid)->unscheduleFromDispatchQueue(hid, nullptr);
        (*plugIn)->Stop(plugIn);
    }
    (*plugIn)->Start(plugIn, nullptr, offeredService.get());
    device->plug();
    (*hid)->scheduleWithDispatchQueue(hid, serialQueue.boundary());
    const std::uint32_t left = releaseService(); // without an unschedule: the thread goes on
    EXPECT_GE(left, 1u);
    device->unplug(); // until its device goes
    platform.waitUntilEnded(platform.threadsStarted());
    serialQueue.drain();
    EXPECT_EQ(device->counters().references, 2u);
}

} // namespace
} // namespace ZorvaTouch

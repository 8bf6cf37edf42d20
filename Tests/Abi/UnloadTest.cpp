#include "Host/Objects/Accelerometer.h"
#include "Host/Objects/EventSystem.h"
#include "Host/Objects/Service.h"
#include "Host/Runtime/PlugInFile.h"
#include "Host/Runtime/SerialQueue.h"
#include "Host/Simulated/Device.h"
#include "Tests/Support/FramesScript.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <fstream>
#include <iostream>
#include <semaphore>
#include <string>
#include <utility>

namespace ZorvaTouch {
namespace {

constexpr int kCycles = 1000;
constexpr int kWarmCycles = 200; ///< after these, memory is what it will be
constexpr long kMemoryBoundKiB = 1024;

/// Whether the plug-in's file is part of this process.
bool isMapped() {
    std::ifstream maps("/proc/self/maps");
    for (std::string line; std::getline(maps, line);)
        if (line.find("ZorvaTouchHIDService.so") != std::string::npos)
            return true;
    return false;
}

long residentKiB() {
    std::ifstream status("/proc/self/status");
    for (std::string line; std::getline(status, line);)
        if (line.starts_with("VmRSS:"))
            return std::stol(line.substr(6));
    return -1;
}

/// What a host keeps of a service: released before the file is unloaded.
struct Kept {
    Ref<const ZorvaEvent> tap;
    Ref<const ZorvaValue> version;
};

/// A host that waits for a tap and keeps it.
class TapKeeper {
public:
    static void receive(void *keeper, void *, void *, const ZorvaEvent *event, std::uint32_t) {
        auto &self = *static_cast<TapKeeper *>(keeper);
        if (maskOf(event) != ZORVA_EVENT_MASK_TAP)
            return;
        self._tap = Ref<const ZorvaEvent>::retain(event);
        self._isTapped.release();
    }
    static std::int64_t maskOf(const ZorvaEvent *event) {
        std::int64_t mask = 0;
        event->table->integerField(event, kZorvaFieldDigitizerMask, &mask);
        return mask;
    }
    [[nodiscard]] Ref<const ZorvaEvent> wait() {
        _isTapped.acquire();
        return std::move(_tap);
    }

private:
    std::binary_semaphore _isTapped{0};
    Ref<const ZorvaEvent> _tap;
};

/// A finger on electrode A for three images. The device keeps the reports until the service listens.
void deliverATap(Simulated::Device &device) {
    for (std::uint32_t frame = 0; frame < 4; ++frame)
        device.deliver(Scripted::imageReport(
                           frame + 1, 10 * frame,
                           Scripted::electrodes({{'A', static_cast<std::int16_t>(frame < 3 ? 300 : 0)}})),
                       0);
}

/// The whole life of a service: made, driven through a tap, released.
/// @param kept  Gets what outlives the service.
void useService(PlugInInterfaceTable **plugIn, Host::SerialQueue &queue, Kept &kept) {
    void *found = nullptr;
    ASSERT_EQ((*plugIn)->QueryInterface(plugIn, kZorvaHidServiceInterface, &found), ZORVA_STATUS_SUCCESS);
    const auto hid = static_cast<HidServiceInterfaceTable **>(found);
    const auto device = Simulated::Device::create();
    const auto system = Host::EventSystem::create();
    const auto accelerometer = Host::Accelerometer::create(system);
    const auto offered = Host::Service::create(device, system);
    TapKeeper keeper;
    ASSERT_EQ((*plugIn)->Start(plugIn, nullptr, offered.get()), ZORVA_STATUS_SUCCESS);
    ASSERT_EQ((*hid)->open(hid, 0), 1);
    (*hid)->setEventCallback(hid, TapKeeper::receive, &keeper, nullptr);
    (*hid)->scheduleWithDispatchQueue(hid, queue.boundary());
    deliverATap(*device.get());
    kept.tap = keeper.wait();
    kept.version = Ref<const ZorvaValue>::adopt((*hid)->copyProperty(hid, "Version"));
    (*hid)->unscheduleFromDispatchQueue(hid, queue.boundary());
    queue.drain(); // batches hold the service
    (*hid)->close(hid, 0);
    EXPECT_EQ((*plugIn)->Stop(plugIn), ZORVA_STATUS_SUCCESS);
    EXPECT_EQ((*hid)->Release(hid), 1u);
    EXPECT_EQ((*plugIn)->Release(plugIn), 0u);
    EXPECT_EQ(device->counters().handled, 4u);
    EXPECT_EQ(device->counters().references, 2u); // this one and the offered service's
}

void loadUseAndUnload(Host::SerialQueue &queue) {
    const Host::PlugInFile file(ZORVA_PLUGIN_FILE);
    void *const made = file.factory(ZORVA_TOUCH_FACTORY_NAME)(nullptr, kZorvaHidServicePlugInType);
    ASSERT_NE(made, nullptr);
    Kept kept; // goes before the file
    useService(static_cast<PlugInInterfaceTable **>(made), queue, kept);
    ASSERT_TRUE(kept.tap && kept.version);
    EXPECT_EQ(TapKeeper::maskOf(kept.tap.get()), ZORVA_EVENT_MASK_TAP);
    EXPECT_EQ(kept.version->table->count(kept.version.get()), 3u);
}

TEST(PlugInUnloading, LeavesNothingAfterEachOfAThousandServices) {
    Host::SerialQueue queue("events");
    long warm = 0;
    for (int cycle = 1; cycle <= kCycles && !HasFailure(); ++cycle) {
        loadUseAndUnload(queue);
        ASSERT_FALSE(isMapped()) << "after cycle " << cycle;
        if (cycle == kWarmCycles)
            warm = residentKiB();
    }
    const long grown = residentKiB() - warm;
    if (ZORVA_SANITIZED)
        std::cout << "Not held against the bound, since a sanitizer keeps memory: " << grown << " KiB\n";
    else
        EXPECT_LT(grown, kMemoryBoundKiB);
}

} // namespace
} // namespace ZorvaTouch

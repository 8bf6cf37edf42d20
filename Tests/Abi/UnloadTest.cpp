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

/// A host's callback: lets its target go on at a tap.
void releaseAtATap(void *tapped, void *, void *, const ZorvaEvent *event, std::uint32_t) {
    std::int64_t mask = 0;
    event->table->integerField(event, kZorvaFieldDigitizerMask, &mask);
    if (mask == ZORVA_EVENT_MASK_TAP)
        static_cast<std::binary_semaphore *>(tapped)->release();
}

/// A finger on electrode A for three images. The device keeps the reports until the service listens.
void deliverATap(Simulated::Device &device) {
    for (std::uint32_t frame = 0; frame < 4; ++frame)
        device.deliver(Scripted::imageReport(
                           frame + 1, 10 * frame,
                           Scripted::electrodes({{'A', static_cast<std::int16_t>(frame < 3 ? 300 : 0)}})),
                       0);
}

/// The whole life of a service: made, driven through a tap, let go of.
void useService(PlugInInterfaceTable **plugIn, Host::SerialQueue &queue) {
    void *found = nullptr;
    ASSERT_EQ((*plugIn)->QueryInterface(plugIn, kZorvaHidServiceInterface, &found), ZORVA_STATUS_SUCCESS);
    const auto hid = static_cast<HidServiceInterfaceTable **>(found);
    const auto device = Simulated::Device::create();
    const auto system = Host::EventSystem::create();
    const auto accelerometer = Host::Accelerometer::create(system);
    const auto offered = Host::Service::create(device, system);
    std::binary_semaphore tapped(0);
    ASSERT_EQ((*plugIn)->Start(plugIn, nullptr, offered.get()), ZORVA_STATUS_SUCCESS);
    ASSERT_EQ((*hid)->open(hid, 0), 1);
    (*hid)->setEventCallback(hid, releaseAtATap, &tapped, nullptr);
    (*hid)->scheduleWithDispatchQueue(hid, queue.boundary());
    deliverATap(*device.get());
    tapped.acquire();
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
    useService(static_cast<PlugInInterfaceTable **>(made), queue);
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

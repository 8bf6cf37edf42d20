#pragma once

#include "Host/Objects/Accelerometer.h"
#include "Host/Objects/EventSystem.h"
#include "Host/Objects/Service.h"
#include "Host/Simulated/Device.h"
#include "Plugin/ZorvaPlugIn.h"
#include "Shared/Util/PropertyValue.h"
#include "Tests/Support/FramesScript.h"
#include "Tests/Support/HostObjects.h"
#include "Tests/Support/HostPlatform.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <initializer_list>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

/// A host around one service, which it drives through its tables and in no other way.
namespace ZorvaTouch::Testing {

using Lines = std::vector<std::string>;
using Bytes = std::vector<std::uint8_t>;

/// A host's event callback: keeps what it is called with. The target is this object.
///
/// Threads: any.
class EventJournal {
public:
    struct Call {
        void *refcon;
        void *sender;
        std::uint32_t options;
        std::string event; ///< in words, as `Scripted::eventText`
        std::uint64_t timestamp;
    };

    static void receive(void *target, void *refcon, void *sender, const ZorvaEvent *event,
                        std::uint32_t options);

    [[nodiscard]] std::vector<Call> calls() const;
    [[nodiscard]] Lines events() const;

private:
    mutable std::mutex _lock;
    std::vector<Call> _calls;
};

/// The host: a platform, a simulated device and, if asked for, an accelerometer; and a queue that runs when
/// it is told to.
class ServiceTest : public ::testing::Test {
protected:
    explicit ServiceTest(Ports::TimeBase base = {});
    ~ServiceTest() override; ///< unschedules, and expects the last release to leave nothing

    /// Gives the host an accelerometer; before `start`.
    void attachAccelerometer();
    /// Starts the service with the simulated device, or with something else.
    void start();
    void start(ZorvaService *offered);
    void setCallback(EventJournal &target, void *refcon = nullptr);
    /// Schedules, and waits until the device is scheduled as well.
    void schedule();
    void schedule(ZorvaQueue *other);
    void unschedule();
    /// Start, callback, schedule.
    void run();
    /// Gives the host's reference back: the service goes, or lives on by itself.
    std::uint32_t releaseService();

    /// Sends reports, and waits until each has been handled.
    void deliver(const Bytes &report, std::uint64_t timestamp = 0);
    /// One image; numbers count from 1 and times from 0 ms in steps of 10.
    void image(std::initializer_list<Scripted::Touch> touches = {});
    /// A finger that rests on electrode A for 30 ms: two events, may-begin in the first image, tap in the
    /// fourth.
    void tap();

    [[nodiscard]] PropertyValue get(const char *key);
    bool set(const char *key, const PropertyValue &value);
    [[nodiscard]] std::uint32_t referenceCount(); ///< of the service

    TestPlatform platform;
    std::shared_ptr<Host::EventSystem> eventSystem;
    Ref<Host::Accelerometer> accelerometer;
    const Ref<Simulated::Device> device = Simulated::Device::create();
    Ref<Host::Service> offeredService;
    const Ref<ManualQueue> queue = ManualQueue::create();
    EventJournal events;
    PlugInInterfaceTable **plugIn = nullptr;
    HidServiceInterfaceTable **hid = nullptr;

private:
    std::uint32_t _imageNumber = 0;
    std::size_t _loops = 0;
};

} // namespace ZorvaTouch::Testing

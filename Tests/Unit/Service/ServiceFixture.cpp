#include "Tests/Unit/Service/ServiceFixture.h"

#include "Plugin/EventObject.h"
#include "Plugin/ValueObject.h"
#include "Service/ZorvaTouchHIDService.h"

#include <utility>

namespace ZorvaTouch::Testing {

// --- The callback --------------------------------------------------------------------------------

void EventJournal::receive(void *target, void *refcon, void *sender, const ZorvaEvent *event,
                           std::uint32_t options) {
    auto &self = *static_cast<EventJournal *>(target);
    const auto read = readEvent(event);
    const std::lock_guard guard(self._lock);
    self._calls.push_back({refcon, sender, options, Scripted::eventText(*read), read->timestamp()});
}

std::vector<EventJournal::Call> EventJournal::calls() const {
    const std::lock_guard guard(_lock);
    return _calls;
}

Lines EventJournal::events() const {
    Lines events;
    for (const Call &call : calls())
        events.push_back(call.event);
    return events;
}

// --- The host ------------------------------------------------------------------------------------

ServiceTest::ServiceTest(Ports::TimeBase base) : platform(base) {
    auto &service = *new ZorvaTouchHIDService(platform);
    plugIn = service.getPluginInterface();
    void *found = nullptr;
    (*plugIn)->QueryInterface(plugIn, kZorvaHidServiceInterface, &found);
    hid = static_cast<HidServiceInterfaceTable **>(found);
    (*hid)->Release(hid); // one reference in all is easier to follow
}

ServiceTest::~ServiceTest() {
    if (!plugIn)
        return;
    unschedule();
    queue->runAll(); // what waits there holds the service, too
    EXPECT_EQ(releaseService(), 0u);
}

void ServiceTest::attachAccelerometer() {
    eventSystem = Host::EventSystem::create();
    accelerometer = Host::Accelerometer::create(eventSystem);
}

void ServiceTest::start() {
    offeredService = Host::Service::create(device, eventSystem);
    start(offeredService.get());
}

void ServiceTest::start(ZorvaService *offered) {
    EXPECT_EQ((*plugIn)->Start(plugIn, nullptr, offered), ZORVA_STATUS_SUCCESS);
}

void ServiceTest::setCallback(EventJournal &target, void *refcon) {
    (*hid)->setEventCallback(hid, EventJournal::receive, &target, refcon);
}

void ServiceTest::schedule() { schedule(queue.get()); }

void ServiceTest::schedule(ZorvaQueue *other) {
    (*hid)->scheduleWithDispatchQueue(hid, other);
    platform.waitUntilLooping(++_loops);
}

void ServiceTest::unschedule() { (*hid)->unscheduleFromDispatchQueue(hid, queue.get()); }

void ServiceTest::run() {
    start();
    setCallback(events);
    schedule();
}

std::uint32_t ServiceTest::releaseService() {
    hid = nullptr;
    PlugInInterfaceTable **const last = std::exchange(plugIn, nullptr);
    return (*last)->Release(last);
}

void ServiceTest::deliver(const Bytes &report, std::uint64_t timestamp) {
    EXPECT_TRUE(device->deliver(report, timestamp));
    device->waitUntilHandled();
}

void ServiceTest::image(std::initializer_list<Scripted::Touch> touches) {
    const std::uint32_t number = ++_imageNumber;
    deliver(Scripted::imageReport(number, 10 * (number - 1), Scripted::electrodes(touches)));
}

void ServiceTest::tap() {
    for (int frame = 0; frame < 3; ++frame)
        image({{'A', 300}});
    image();
}

PropertyValue ServiceTest::get(const char *key) {
    const auto value = Ref<const ZorvaValue>::adopt((*hid)->copyProperty(hid, key));
    return readValue(value.get());
}

bool ServiceTest::set(const char *key, const PropertyValue &value) {
    return (*hid)->setProperty(hid, key, makeValue(value).get()) == 1;
}

std::uint32_t ServiceTest::referenceCount() {
    (*plugIn)->AddRef(plugIn);
    return (*plugIn)->Release(plugIn);
}

} // namespace ZorvaTouch::Testing

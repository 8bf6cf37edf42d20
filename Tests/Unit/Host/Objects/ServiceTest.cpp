#include "Host/Objects/Service.h"

#include "Host/Simulated/Device.h"
#include "Plugin/ValueObject.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Host {
namespace {

using Simulated::Device;

ZorvaStatus openOf(ZorvaDevice *device) { return device->table->open(device, 0); }

TEST(SimulatedService, HandsOutReferencesToItsDevice) {
    const auto device = Device::create();
    const auto service = Service::create(device);
    EXPECT_EQ(device->counters().references, 2u);
    {
        const auto created = Ref<ZorvaDevice>::adopt(service->table->createDevice(service.get()));
        EXPECT_EQ(created.get(), device.get());
        EXPECT_EQ(openOf(created.get()), 0u);
        EXPECT_EQ(device->counters().references, 3u);
    }
    EXPECT_EQ(device->counters().references, 2u);
    EXPECT_EQ(service->devicesCreated(), 1u);
}

TEST(SimulatedService, KeepsItsDevice) {
    auto service = Service::create(Device::create());
    const auto device = Ref<ZorvaDevice>::adopt(service->table->createDevice(service.get()));
    service.reset();
    EXPECT_EQ(openOf(device.get()), 0u) << "and so does who created it";
}

TEST(SimulatedService, HasNoDeviceUntilItIsGivenOne) {
    const auto service = Service::create({});
    EXPECT_EQ(service->table->createDevice(service.get()), nullptr);
    EXPECT_EQ(service->devicesCreated(), 0u);
    const auto device = Device::create();
    service->setDevice(device);
    EXPECT_EQ(Ref<ZorvaDevice>::adopt(service->table->createDevice(service.get())).get(), device.get());
    service->setDevice({});
    EXPECT_EQ(service->table->createDevice(service.get()), nullptr);
    EXPECT_EQ(device->counters().references, 1u);
}

TEST(SimulatedService, HasNoClientsWithoutAnEventSystem) {
    const auto service = Service::create(Device::create());
    EXPECT_EQ(service->table->createEventClient, nullptr);
}

TEST(SimulatedService, CreatesMonitorsOfItsEventSystem) {
    const auto system = EventSystem::create();
    const auto service = Service::create(Device::create(), system);
    const auto create = [&](std::uint32_t type) {
        return Ref<ZorvaEventClient>::adopt(service->table->createEventClient(service.get(), type));
    };
    {
        const auto client = create(ZORVA_EVENT_CLIENT_MONITOR);
        ASSERT_TRUE(client);
        EXPECT_EQ(system->counters().clients, 1u);
    }
    EXPECT_EQ(system->counters().clients, 0u);
    EXPECT_FALSE(create(0)) << "there is no other kind";
    service->refuseEventClients(true);
    EXPECT_FALSE(create(ZORVA_EVENT_CLIENT_MONITOR));
    EXPECT_EQ(service->clientsCreated(), 1u);
}

TEST(SimulatedService, KeepsWhatIsSet) {
    const auto service = Service::create(Device::create());
    EXPECT_EQ(service->table->setProperty(service.get(), "Key", makeValue(5u).get()), 1);
    EXPECT_EQ(service->properties().get("Key"), PropertyValue(5u));
    service->properties().makeReadOnly("Key");
    EXPECT_EQ(service->table->setProperty(service.get(), "Key", makeValue(6u).get()), 0);
    EXPECT_EQ(service->properties().get("Key"), PropertyValue(5u));
}

} // namespace
} // namespace ZorvaTouch::Host

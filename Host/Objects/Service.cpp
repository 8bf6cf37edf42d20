#include "Host/Objects/Service.h"

#include "Plugin/Guarded.h"

#include <utility>

namespace ZorvaTouch::Host {

/// The service as the other side sees it.
struct Service::Entries {
    static ZorvaDevice *createDevice(ZorvaService *service) noexcept { return of(service).createDevice(); }
    static ZorvaEventClient *createEventClient(ZorvaService *service, std::uint32_t type) noexcept {
        return guarded<ZorvaEventClient *>(nullptr, [&] { return of(service).createEventClient(type); });
    }
    static ZorvaBoolean setProperty(ZorvaService *service, const char *key,
                                    const ZorvaValue *value) noexcept {
        return of(service)._properties.setFromOther(key, value);
    }
};

const ZorvaServiceTable Service::kTable{
    .size = sizeof(ZorvaServiceTable),
    .retain = Service::retain<ZorvaService>,
    .release = Service::release<ZorvaService>,
    .createDevice = Entries::createDevice,
    .createEventClient = Entries::createEventClient,
    .setProperty = Entries::setProperty,
};

const ZorvaServiceTable Service::kTableWithoutEvents{
    .size = sizeof(ZorvaServiceTable),
    .retain = Service::retain<ZorvaService>,
    .release = Service::release<ZorvaService>,
    .createDevice = Entries::createDevice,
    .createEventClient = nullptr,
    .setProperty = Entries::setProperty,
};

Ref<Service> Service::create(Ref<ZorvaDevice> device, std::shared_ptr<EventSystem> system) {
    return Ref<Service>::adopt(new Service(std::move(device), std::move(system)));
}

Service::Service(Ref<ZorvaDevice> device, std::shared_ptr<EventSystem> system)
    : BoundaryObject(system ? &kTable : &kTableWithoutEvents), _system(std::move(system)),
      _device(std::move(device)) {}

void Service::setDevice(Ref<ZorvaDevice> device) {
    MutexLock lock(_lock);
    std::swap(_device, device);
}

void Service::refuseEventClients(bool isRefused) {
    MutexLock lock(_lock);
    _areClientsRefused = isRefused;
}

ZorvaDevice *Service::createDevice() {
    MutexLock lock(_lock);
    if (_device)
        ++_devicesCreated;
    return Ref<ZorvaDevice>::retain(_device.get()).release();
}

ZorvaEventClient *Service::createEventClient(std::uint32_t type) {
    MutexLock lock(_lock);
    if (_areClientsRefused || type != ZORVA_EVENT_CLIENT_MONITOR)
        return nullptr;
    Ref<ZorvaEventClient> client = _system->createClient();
    ++_clientsCreated;
    return client.release();
}

std::uint32_t Service::devicesCreated() const {
    MutexLock lock(_lock);
    return _devicesCreated;
}

std::uint32_t Service::clientsCreated() const {
    MutexLock lock(_lock);
    return _clientsCreated;
}

} // namespace ZorvaTouch::Host

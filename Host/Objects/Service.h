#pragma once

#include "Host/Interface/Mutex.h"
#include "Host/Objects/EventSystem.h"
#include "Host/Objects/Properties.h"
#include "Plugin/BoundaryObject.h"

#include <cstdint>
#include <memory>

namespace ZorvaTouch::Host {

/// The place where a device is attached: what a plug-in is started with. It keeps the device and
/// the event system. What the plug-in sets is among its properties afterwards.
///
/// Threads: any, several at a time.
class Service final : public BoundaryObject<Service, ZorvaService> {
public:
    /// @param device  Null: there is none to be had.
    /// @param system  Null: the host has no event system; the table's entry is null.
    /// @throws std::bad_alloc, std::system_error
    [[nodiscard]] static Ref<Service> create(Ref<ZorvaDevice> device,
                                             std::shared_ptr<EventSystem> system = nullptr);

    /// The device of the next starts; null for none.
    void setDevice(Ref<ZorvaDevice> device);
    /// Whether the event system gives no clients.
    void refuseEventClients(bool isRefused);

    [[nodiscard]] Properties &properties() noexcept { return _properties; }
    [[nodiscard]] std::uint32_t devicesCreated() const;
    [[nodiscard]] std::uint32_t clientsCreated() const;

private:
    friend class BoundaryObject<Service, ZorvaService>;
    struct Entries;
    static const ZorvaServiceTable kTable;
    static const ZorvaServiceTable kTableWithoutEvents;

    Service(Ref<ZorvaDevice> device, std::shared_ptr<EventSystem> system);
    ~Service() = default;

    ZorvaDevice *createDevice();
    ZorvaEventClient *createEventClient(std::uint32_t type);

    Properties _properties;
    const std::shared_ptr<EventSystem> _system;
    mutable Mutex _lock;
    Ref<ZorvaDevice> _device ZORVA_GUARDED_BY(_lock);
    bool _areClientsRefused ZORVA_GUARDED_BY(_lock) = false;
    std::uint32_t _devicesCreated ZORVA_GUARDED_BY(_lock) = 0;
    std::uint32_t _clientsCreated ZORVA_GUARDED_BY(_lock) = 0;
};

} // namespace ZorvaTouch::Host

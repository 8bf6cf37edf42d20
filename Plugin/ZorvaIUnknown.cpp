#include "Plugin/ZorvaIUnknown.h"

#include "Plugin/ObjectCheck.h"
#include "Plugin/ValueObject.h"

#include <cstring>
#include <exception>

namespace ZorvaTouch::ZorvaIUnknown {
namespace {

/// Reads a pointer at an address, whatever it was declared as.
void *pointerAt(const void *address) noexcept {
    void *pointer = nullptr;
    std::memcpy(&pointer, address, sizeof pointer);
    return pointer;
}

/// From an interface pointer to the service: the pointer is the address of a field that holds the address of
/// a table, and each table begins with the object.
ZorvaHIDService &serviceOf(void *self) noexcept {
    return *static_cast<ZorvaHIDService *>(pointerAt(pointerAt(self)));
}

/// Calls an operation of the service; what it throws becomes `failure` and one report.
template <typename Result, typename Operation>
Result forward(void *self, const char *name, Result failure, Operation operation) noexcept {
    if (!self)
        return failure;
    const ServiceReference<ZorvaHIDService> service(serviceOf(self));
    try {
        return operation(*service);
    } catch (const std::exception &error) {
        service->reportFailure(name, error.what());
    } catch (...) {
        service->reportFailure(name, "unknown exception");
    }
    return failure;
}

/// The same for an operation without a result.
template <typename Operation> void forward(void *self, const char *name, Operation operation) noexcept {
    forward(self, name, false, [&](ZorvaHIDService &service) {
        operation(service);
        return true;
    });
}

bool areEqual(const ZorvaUuid &left, const ZorvaUuid &right) noexcept {
    return std::memcmp(left.bytes, right.bytes, sizeof left.bytes) == 0;
}

ZorvaStatus queryInterface(void *self, ZorvaUuid identifier, void **outInterface) noexcept {
    if (!self || !outInterface)
        return ZORVA_STATUS_NO_INTERFACE;
    ZorvaHIDService &service = serviceOf(self);
    // The convention's base identifier is deliberately not answered: a host asks for one of the two tables.
    if (areEqual(identifier, kZorvaPlugInInterface))
        *outInterface = service.getPluginInterface();
    else if (areEqual(identifier, kZorvaHidServiceInterface))
        *outInterface = service.getServiceInterface();
    else
        return ZORVA_STATUS_NO_INTERFACE;
    service.retain();
    return ZORVA_STATUS_SUCCESS;
}

std::uint32_t addRef(void *self) noexcept { return self ? serviceOf(self).retain() : 0; }

std::uint32_t release(void *self) noexcept { return self ? serviceOf(self).release() : 0; }

ZorvaStatus probe(void *self, const ZorvaValue *properties, ZorvaService *offered,
                  std::int32_t *outScore) noexcept {
    return forward(self, "Probe", ZORVA_STATUS_NO_RESOURCES, [&](ZorvaHIDService &service) {
        return service.probeWithService(offered, properties, outScore);
    });
}

ZorvaStatus start(void *self, const ZorvaValue *properties, ZorvaService *offered) noexcept {
    return forward(self, "Start", ZORVA_STATUS_NO_RESOURCES,
                   [&](ZorvaHIDService &service) { return service.startWithService(offered, properties); });
}

ZorvaStatus stop(void *self) noexcept {
    return forward(self, "Stop", ZORVA_STATUS_NO_RESOURCES,
                   [](ZorvaHIDService &service) { return service.stop(); });
}

ZorvaBoolean open(void *self, std::uint32_t options) noexcept {
    return forward(self, "open", false,
                   [&](ZorvaHIDService &service) { return service.openWithOptions(options); });
}

void close(void *self, std::uint32_t options) noexcept {
    forward(self, "close", [&](ZorvaHIDService &service) { service.closeWithOptions(options); });
}

const ZorvaValue *copyProperty(void *self, const char *key) noexcept {
    const ZorvaValue *const none = nullptr;
    return forward(self, "copyProperty", none, [&](ZorvaHIDService &service) {
        const PropertyValue value = service.getPropertyForKey(key);
        return value.isNull() ? none : makeValue(value).release();
    });
}

ZorvaBoolean setProperty(void *self, const char *key, const ZorvaValue *value) noexcept {
    return forward(self, "setProperty", false, [&](ZorvaHIDService &service) {
        return service.setPropertyForKey(readValue(value), key);
    });
}

void setEventCallback(void *self, ZorvaEventCallback callback, void *target, void *refcon) noexcept {
    forward(self, "setEventCallback",
            [&](ZorvaHIDService &service) { service.setEventCallback(callback, target, refcon); });
}

/// The queue for the time of a call; null if it is not one that can be used.
Ref<ZorvaQueue> heldQueue(ZorvaQueue *queue) noexcept {
    return isComplete(queue) ? Ref<ZorvaQueue>::retain(queue) : Ref<ZorvaQueue>();
}

void scheduleWithDispatchQueue(void *self, ZorvaQueue *queue) noexcept {
    const Ref<ZorvaQueue> held = heldQueue(queue);
    forward(self, "scheduleWithDispatchQueue",
            [&](ZorvaHIDService &service) { service.scheduleWithDispatchQueue(held.get()); });
}

void unscheduleFromDispatchQueue(void *self, ZorvaQueue *queue) noexcept {
    const Ref<ZorvaQueue> held = heldQueue(queue);
    forward(self, "unscheduleFromDispatchQueue",
            [&](ZorvaHIDService &service) { service.unscheduleWithDispatchQueue(held.get()); });
}

const ZorvaEvent *copyEvent(void *self, std::uint32_t type, const ZorvaEvent *matching,
                            std::uint32_t options) noexcept {
    const ZorvaEvent *const none = nullptr;
    return forward(self, "copyEvent", none, [&](ZorvaHIDService &service) {
        return service.copyEventWithType(type, matching, options).release();
    });
}

ZorvaStatus setOutputEvent(void *self, const ZorvaEvent *event) noexcept {
    return forward(self, "setOutputEvent", ZORVA_STATUS_NO_RESOURCES,
                   [&](ZorvaHIDService &service) { return service.setOutputEvent(event); });
}

} // namespace

PlugInInterfaceTable plugInTable(ZorvaHIDService &service) noexcept {
    return {
        .object = &service,
        .QueryInterface = queryInterface,
        .AddRef = addRef,
        .Release = release,
        .version = 1,
        .revision = 0,
        .Probe = probe,
        .Start = start,
        .Stop = stop,
    };
}

HidServiceInterfaceTable hidServiceTable(ZorvaHIDService &service) noexcept {
    return {
        .object = &service,
        .QueryInterface = queryInterface,
        .AddRef = addRef,
        .Release = release,
        .open = open,
        .close = close,
        .copyProperty = copyProperty,
        .setProperty = setProperty,
        .setEventCallback = setEventCallback,
        .scheduleWithDispatchQueue = scheduleWithDispatchQueue,
        .unscheduleFromDispatchQueue = unscheduleFromDispatchQueue,
        .copyEvent = copyEvent,
        .setOutputEvent = setOutputEvent,
    };
}

} // namespace ZorvaTouch::ZorvaIUnknown

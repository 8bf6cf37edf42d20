#pragma once

#include "Plugin/Ref.h"
#include "Plugin/ReferenceCount.h"
#include "Plugin/ZorvaPlugIn.h"
#include "Shared/Util/PropertyValue.h"

#include <cstdint>
#include <utility>

namespace ZorvaTouch {

/// Base of HID services: the two tables that a host drives a service through, and the reference count.
///
/// A subclass overrides the operations it has; the defaults are those of a service that can do nothing.
/// `ZorvaPlugIn.h` says what each of them does and on which thread it is called. They may throw: the tables'
/// functions turn that into the failure that the host is told of, and into one call of `reportFailure`.
// NOLINTNEXTLINE(cppcoreguidelines-virtual-class-destructor): the last release alone destroys it
class ZorvaHIDService {
public:
    ZorvaHIDService(const ZorvaHIDService &) = delete;
    ZorvaHIDService &operator=(const ZorvaHIDService &) = delete;

    // The interface pointers. Valid as long as the object.
    [[nodiscard]] PlugInInterfaceTable **getPluginInterface() noexcept { return &_pluginInterface; }
    [[nodiscard]] HidServiceInterfaceTable **getServiceInterface() noexcept { return &_serviceInterface; }

    /// One reference more, and less; the last one deletes the object, on whichever thread.
    /// @return The count after it.
    std::uint32_t retain() noexcept { return _references.retain(); }
    std::uint32_t release() noexcept;

    // The plug-in table's operations.
    [[nodiscard]] virtual ZorvaStatus probeWithService(ZorvaService *service, const ZorvaValue *properties,
                                                       std::int32_t *outScore);
    [[nodiscard]] virtual ZorvaStatus startWithService(ZorvaService *service, const ZorvaValue *properties);
    virtual ZorvaStatus stop();

    // The service table's.
    [[nodiscard]] virtual bool openWithOptions(std::uint32_t options);
    virtual void closeWithOptions(std::uint32_t options);
    /// @param key  Null has no value and takes none.
    /// @return Null if there is no such property.
    [[nodiscard]] virtual PropertyValue getPropertyForKey(const char *key);
    virtual bool setPropertyForKey(const PropertyValue &value, const char *key);
    virtual void setEventCallback(ZorvaEventCallback callback, void *target, void *refcon);
    virtual void scheduleWithDispatchQueue(ZorvaQueue *queue);
    virtual void unscheduleWithDispatchQueue(ZorvaQueue *queue);
    [[nodiscard]] virtual Ref<const ZorvaEvent>
    copyEventWithType(std::uint32_t type, const ZorvaEvent *matching, std::uint32_t options);
    virtual ZorvaStatus setOutputEvent(const ZorvaEvent *event);

    /// Told of an exception that an operation ended in. Does nothing by default.
    virtual void reportFailure(const char *operation, const char *reason) noexcept;

protected:
    /// @throws std::bad_alloc
    ZorvaHIDService();
    virtual ~ZorvaHIDService();

private:
    PlugInInterfaceTable *_pluginInterface = nullptr;
    HidServiceInterfaceTable *_serviceInterface = nullptr;
    ReferenceCount _references;
};

/// Holds a reference to a service.
template <typename Service> class ServiceReference {
public:
    explicit ServiceReference(Service &service) noexcept : _service(&service) { service.retain(); }
    ServiceReference(const ServiceReference &other) noexcept : ServiceReference(*other._service) {}
    ServiceReference &operator=(const ServiceReference &) = delete;
    ~ServiceReference() { _service->release(); }

    Service &operator*() const noexcept { return *_service; }
    Service *operator->() const noexcept { return _service; }

private:
    Service *_service;
};

} // namespace ZorvaTouch

#include "Host/Simulated/Device.h"

#include "Plugin/Guarded.h"

namespace ZorvaTouch::Simulated {

/// The device as the other side sees it.
struct Device::Entries {
    static void retain(ZorvaDevice *device) noexcept {
        of(device)._referenceCount.fetch_add(1, std::memory_order_relaxed);
        BoundaryObject::retain(device);
    }
    static void release(ZorvaDevice *device) noexcept {
        of(device)._referenceCount.fetch_sub(1, std::memory_order_relaxed);
        BoundaryObject::release(device);
    }
    static ZorvaStatus open(ZorvaDevice *device, std::uint32_t options) noexcept {
        return of(device).open(options);
    }
    static ZorvaStatus close(ZorvaDevice *device, std::uint32_t options) noexcept {
        return of(device).close(options);
    }
    static void registerInputReportCallback(ZorvaDevice *device, std::uint8_t *buffer, std::size_t bufferSize,
                                            ZorvaInputReportCallback callback, void *context) noexcept {
        of(device).setCallback({{buffer, buffer ? bufferSize : 0}, callback, context});
    }
    static void schedule(ZorvaDevice *device, ZorvaRunLoop *loop, const char *mode) noexcept {
        guarded(false, [&] {
            of(device).schedule(loop, mode);
            return true;
        });
    }
    static void unschedule(ZorvaDevice *device, ZorvaRunLoop *loop, const char *mode) noexcept {
        of(device).unschedule(loop, mode);
    }
    static ZorvaStatus getFeatureReport(ZorvaDevice *device, std::uint32_t reportId, std::uint8_t *buffer,
                                        std::size_t *length) noexcept {
        return of(device).readFeatureReport(reportId, {buffer, buffer ? *length : 0}, *length);
    }
    static const ZorvaValue *copyProperty(ZorvaDevice *device, const char *key) noexcept {
        return of(device)._properties.copyForOther(key);
    }
    static ZorvaBoolean setProperty(ZorvaDevice *device, const char *key, const ZorvaValue *value) noexcept {
        return of(device)._properties.setFromOther(key, value);
    }
};

const ZorvaDeviceTable Device::kTable{
    .size = sizeof(ZorvaDeviceTable),
    .retain = Entries::retain,
    .release = Entries::release,
    .open = Entries::open,
    .close = Entries::close,
    .registerInputReportCallback = Entries::registerInputReportCallback,
    .schedule = Entries::schedule,
    .unschedule = Entries::unschedule,
    .getFeatureReport = Entries::getFeatureReport,
    .copyProperty = Entries::copyProperty,
    .setProperty = Entries::setProperty,
};

} // namespace ZorvaTouch::Simulated

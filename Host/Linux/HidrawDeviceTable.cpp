#include "Host/Linux/HidrawDevice.h"
#include "Plugin/Guarded.h"
#include "Plugin/ValueObject.h"

namespace ZorvaTouch::Linux {

/// The device as the other side sees it.
struct HidrawDevice::Entries {
    static ZorvaStatus open(ZorvaDevice *device, std::uint32_t /*options*/) noexcept {
        return guarded(ZORVA_STATUS_NO_RESOURCES, [&] { return of(device).open(); });
    }
    static ZorvaStatus close(ZorvaDevice *device, std::uint32_t /*options*/) noexcept {
        of(device).close();
        return ZORVA_STATUS_SUCCESS;
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
        return guarded<const ZorvaValue *>(nullptr, [&]() -> const ZorvaValue * {
            const PropertyValue value = of(device).property(key);
            return value.isNull() ? nullptr : makeValue(value).release();
        });
    }
    static ZorvaBoolean setProperty(ZorvaDevice * /*device*/, const char * /*key*/,
                                    const ZorvaValue * /*value*/) noexcept {
        return 0; // what a device is cannot be changed
    }
};

const ZorvaDeviceTable HidrawDevice::kTable{
    .size = sizeof(ZorvaDeviceTable),
    .retain = BoundaryObject::retain<ZorvaDevice>,
    .release = BoundaryObject::release<ZorvaDevice>,
    .open = Entries::open,
    .close = Entries::close,
    .registerInputReportCallback = Entries::registerInputReportCallback,
    .schedule = Entries::schedule,
    .unschedule = Entries::unschedule,
    .getFeatureReport = Entries::getFeatureReport,
    .copyProperty = Entries::copyProperty,
    .setProperty = Entries::setProperty,
};

} // namespace ZorvaTouch::Linux

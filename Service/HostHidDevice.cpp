#include "Service/HostHidDevice.h"

#include "Plugin/ObjectCheck.h"
#include "Plugin/ValueObject.h"

#include <algorithm>

namespace ZorvaTouch {

HostHidDevice HostHidDevice::create(ZorvaService *service) noexcept {
    HostHidDevice created;
    if (!isComplete(service))
        return created;
    ZorvaDevice *const device = service->table->createDevice(service);
    if (isComplete(device))
        created._device = Ref<ZorvaDevice>::adopt(device);
    return created;
}

bool HostHidDevice::open(std::uint32_t options) const noexcept {
    return _device && _device->table->open(_device.get(), options) == ZORVA_STATUS_SUCCESS;
}

void HostHidDevice::close(std::uint32_t options) const noexcept {
    if (_device)
        _device->table->close(_device.get(), options);
}

void HostHidDevice::registerInputReportCallback(std::span<std::uint8_t> buffer,
                                                ZorvaInputReportCallback callback,
                                                void *context) const noexcept {
    if (_device)
        _device->table->registerInputReportCallback(_device.get(), buffer.data(), buffer.size(), callback,
                                                    context);
}

void HostHidDevice::scheduleWithRunLoop(Host::RunLoop &loop, const char *mode) const noexcept {
    if (_device)
        _device->table->schedule(_device.get(), loop.boundary(), mode);
}

void HostHidDevice::unscheduleFromRunLoop(Host::RunLoop &loop, const char *mode) const noexcept {
    if (_device)
        _device->table->unschedule(_device.get(), loop.boundary(), mode);
}

HostHidDevice::FeatureReportResult
HostHidDevice::getFeatureReport(std::uint32_t reportId, std::span<std::uint8_t> buffer) const noexcept {
    if (!_device)
        return {ZORVA_STATUS_NO_RESOURCES, 0};
    std::size_t length = buffer.size();
    const ZorvaStatus status =
        _device->table->getFeatureReport(_device.get(), reportId, buffer.data(), &length);
    return {status, std::min(length, buffer.size())};
}

PropertyValue HostHidDevice::property(const char *key) const {
    if (!_device)
        return {};
    const ZorvaValue *const value = _device->table->copyProperty(_device.get(), key);
    if (!isComplete(value))
        return {};
    const auto reference = Ref<const ZorvaValue>::adopt(value);
    return readValue(value);
}

bool HostHidDevice::setProperty(const char *key, const PropertyValue &value) const {
    if (!_device)
        return false;
    const auto object = value.isNull() ? Ref<const ZorvaValue>() : makeValue(value);
    return _device->table->setProperty(_device.get(), key, object.get()) != 0;
}

} // namespace ZorvaTouch

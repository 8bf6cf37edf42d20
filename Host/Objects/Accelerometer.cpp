#include "Host/Objects/Accelerometer.h"

#include "Plugin/EventObject.h"
#include "Plugin/Guarded.h"
#include "Plugin/ValueObject.h"

#include <string_view>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

constexpr const char *kReportInterval = "ReportInterval";

} // namespace

/// The accelerometer as the other side sees it.
struct Accelerometer::Entries {
    static ZorvaDevice *createDevice(ZorvaService *) noexcept { return nullptr; }
    static ZorvaBoolean setProperty(ZorvaService *service, const char *key,
                                    const ZorvaValue *value) noexcept {
        return guarded(ZorvaBoolean{0}, [&] { return of(service).setProperty(key, value); });
    }
};

const ZorvaServiceTable Accelerometer::kTable{
    .size = sizeof(ZorvaServiceTable),
    .retain = Accelerometer::retain<ZorvaService>,
    .release = Accelerometer::release<ZorvaService>,
    .createDevice = Entries::createDevice,
    .createEventClient = nullptr,
    .setProperty = Entries::setProperty,
};

Ref<Accelerometer> Accelerometer::create(const std::shared_ptr<EventSystem> &system,
                                         std::weak_ptr<AccelerometerObserver> observer) {
    auto accelerometer = Ref<Accelerometer>::adopt(new Accelerometer(system, std::move(observer)));
    system->add(accelerometer);
    return accelerometer;
}

Accelerometer::Accelerometer(const std::shared_ptr<EventSystem> &system,
                             std::weak_ptr<AccelerometerObserver> observer)
    : BoundaryObject(&kTable), _properties({{"PrimaryUsagePage", 0xFF00u}, {"PrimaryUsage", 3u}}),
      _system(system), _observer(std::move(observer)) {}

ZorvaBoolean Accelerometer::setProperty(const char *key, const ZorvaValue *value) {
    const bool isOurs = key && std::string_view(key) == kReportInterval;
    const PropertyValue read = isOurs ? readValue(value) : PropertyValue();
    const double *const interval = read.asDouble();
    if (!interval || !_properties.setFromOther(key, value))
        return false;
    if (const auto observer = _observer.lock())
        observer->onReportInterval(*interval);
    return true;
}

void Accelerometer::tellListening(bool isListenedTo) const noexcept {
    if (const auto observer = _observer.lock())
        observer->onListening(isListenedTo);
}

void Accelerometer::deliver(float x, float y, float z, std::uint64_t timestamp) {
    deliver(HostEvent::createAccelerometer(timestamp, {x, y, z}, 0));
}

void Accelerometer::deliver(std::shared_ptr<const HostEvent> event) {
    if (const auto system = _system.lock())
        system->publish(*this, makeEvent(std::move(event)));
}

void Accelerometer::waitUntilHandled() {
    if (const auto system = _system.lock())
        system->waitUntilHandled();
}

void Accelerometer::unplug() {
    if (const auto system = _system.lock())
        system->setPlugged(*this, false);
}

void Accelerometer::plug() {
    if (const auto system = _system.lock())
        system->setPlugged(*this, true);
}

void Accelerometer::withdraw() {
    if (const auto system = _system.lock())
        system->remove(*this);
}

std::optional<double> Accelerometer::reportInterval() const {
    const PropertyValue value = _properties.get(kReportInterval);
    const double *const interval = value.asDouble();
    return interval ? std::optional(*interval) : std::nullopt;
}

} // namespace ZorvaTouch::Host

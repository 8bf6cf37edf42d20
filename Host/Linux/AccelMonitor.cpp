#include "Host/Linux/AccelMonitor.h"

#include "Host/Linux/UdevEvents.h"

#include <unistd.h>

#include <algorithm>
#include <optional>
#include <string>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

constexpr const char *kSubsystem = "iio";
constexpr const char *kAxis = "/scan_elements/in_accel_x_en";

/// An attribute that only says what the device is, so that reading it does not wake the sensor.
std::string attributeOf(udev_device *device, const char *name) {
    return udevText(::udev_device_get_sysattr_value(device, name));
}

/// Nothing if it is no accelerometer: triggers, for one, have no node.
std::optional<AccelIdentity> identityOf(udev_device *device) {
    AccelIdentity identity{.devnode = udevText(::udev_device_get_devnode(device)),
                           .syspath = udevText(::udev_device_get_syspath(device)),
                           .name = {},
                           .label = {},
                           .location = {}};
    if (identity.devnode.empty() || ::access((identity.syspath + kAxis).c_str(), F_OK) != 0)
        return std::nullopt;
    identity.name = attributeOf(device, "name");
    identity.label = attributeOf(device, "label");
    identity.location = attributeOf(device, "location");
    if (identity.location.empty())
        identity.location = udevText(::udev_device_get_property_value(device, "ACCEL_LOCATION"));
    return identity;
}

bool isIn(const std::vector<AccelIdentity> &list, std::string_view syspath) {
    return std::ranges::find(list, syspath, &AccelIdentity::syspath) != list.end();
}

} // namespace

struct AccelMonitor::Udev {
    UdevEvents events;
};

AccelMonitor::AccelMonitor(AccelListener &listener, MonitorSource source)
    : _listener(listener), _source(source), _udev(new Udev{{source, {kSubsystem}}}) {}

AccelMonitor::~AccelMonitor() = default;

int AccelMonitor::descriptor() const noexcept { return _udev->events.descriptor(); }

std::vector<AccelIdentity> AccelMonitor::present() const {
    std::vector<AccelIdentity> found;
    _udev->events.visitPresent(kSubsystem, [&](udev_device *device) {
        const bool isReady = _source == MonitorSource::Kernel || hasUdevPermissions(device);
        if (auto identity = isReady ? identityOf(device) : std::nullopt)
            found.push_back(std::move(*identity));
    });
    std::ranges::sort(found, {}, &AccelIdentity::syspath);
    return found;
}

void AccelMonitor::scan() {
    const std::vector<AccelIdentity> found = present();
    const std::vector<AccelIdentity> before = _known;
    for (const AccelIdentity &accelerometer : before)
        if (!isIn(found, accelerometer.syspath))
            removed(accelerometer.syspath);
    for (const AccelIdentity &accelerometer : found)
        added(accelerometer);
}

void AccelMonitor::receive() {
    const bool isComplete = _udev->events.receive([this](udev_device *device) {
        const std::string action = udevText(::udev_device_get_action(device));
        if (action == "remove")
            removed(udevText(::udev_device_get_syspath(device)));
        else if (action == "add")
            if (const auto identity = identityOf(device))
                added(*identity);
    });
    if (!isComplete)
        scan();
}

void AccelMonitor::added(const AccelIdentity &accelerometer) {
    if (isIn(_known, accelerometer.syspath))
        return;
    _known.push_back(accelerometer);
    _listener.onAdded(accelerometer);
}

void AccelMonitor::removed(std::string_view syspath) {
    const auto known = std::ranges::find(_known, syspath, &AccelIdentity::syspath);
    if (known == _known.end())
        return;
    const AccelIdentity accelerometer = std::move(*known);
    _known.erase(known);
    _listener.onRemoved(accelerometer);
}

} // namespace ZorvaTouch::Linux

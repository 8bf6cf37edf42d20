#include "Host/Linux/DeviceMonitor.h"

#include "Host/Linux/UdevEvents.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <optional>
#include <string>
#include <system_error>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

constexpr const char *kUdevdSocket = "/run/udev/control";
constexpr const char *kNodeSubsystem = "hidraw";
constexpr const char *kHidSubsystem = "hid";

UeventProperties propertiesOf(udev_device *device) {
    UeventProperties properties;
    for (const char *const key : {"HID_ID", "HID_NAME", "HID_PHYS", "HID_UNIQ"})
        if (const char *const value = ::udev_device_get_property_value(device, key))
            properties.emplace(key, value);
    return properties;
}

/// The HID device that a node belongs to; null when it is gone already. Borrowed from the node.
udev_device *hidOf(udev_device *node) noexcept {
    return ::udev_device_get_parent_with_subsystem_devtype(node, kHidSubsystem, nullptr);
}

std::optional<DeviceIdentity> identityOf(udev_device *node) {
    udev_device *const hid = hidOf(node);
    if (!hid)
        return std::nullopt;
    auto identity =
        makeIdentity(udevText(::udev_device_get_devnode(node)), udevText(::udev_device_get_syspath(node)),
                     udevText(::udev_device_get_syspath(hid)), propertiesOf(hid));
    if (identity)
        identity->deviceNumber = ::udev_device_get_devnum(node);
    return identity;
}

/// Whether a node can be told of: its driver is there, and it may be opened. The driver is there, too, for
/// the few milliseconds that it is still at work.
bool isReady(udev_device *node, MonitorSource source) noexcept {
    udev_device *const hid = hidOf(node);
    return hid && ::udev_device_get_driver(hid) &&
           (source == MonitorSource::Kernel || hasUdevPermissions(node));
}

void handle(udev_device *device, DeviceTracker &tracker, MonitorSource source) {
    const std::string action = udevText(::udev_device_get_action(device));
    const std::string syspath = udevText(::udev_device_get_syspath(device));
    const bool isNode = udevText(::udev_device_get_subsystem(device)) == kNodeSubsystem;
    if (!isNode && action == "bind")
        tracker.bound(syspath);
    else if (isNode && action == "remove")
        tracker.removed(syspath);
    else if (isNode && action == "change")
        tracker.changed(syspath);
    else if (isNode && action == "add")
        if (const auto identity = identityOf(device))
            tracker.added(*identity, source == MonitorSource::Udev);
}

/// The nodes that are there and ready; of the others there will be word.
std::vector<DeviceIdentity> presentDevices(const UdevEvents &events, MonitorSource source) {
    std::vector<DeviceIdentity> devices;
    events.visitPresent(kNodeSubsystem, [&](udev_device *node) {
        auto identity = isReady(node, source) ? identityOf(node) : std::nullopt;
        if (identity)
            devices.push_back(std::move(*identity));
    });
    return devices;
}

} // namespace

struct DeviceMonitor::Udev {
    UdevEvents events;
};

MonitorSource detectMonitorSource() noexcept {
    return ::access(kUdevdSocket, F_OK) == 0 ? MonitorSource::Udev : MonitorSource::Kernel;
}

NodeKind nodeKindOf(const std::string &path) {
    struct stat status {};
    if (::stat(path.c_str(), &status) != 0) {
        if (errno == ENOENT)
            return NodeKind::Missing;
        throw std::system_error(errno, std::generic_category(), path);
    }
    if (!S_ISCHR(status.st_mode))
        return NodeKind::Other;
    const UdevOwned<udev> context(::udev_new());
    const UdevOwned<udev_device> device(
        context ? ::udev_device_new_from_devnum(context.get(), 'c', status.st_rdev) : nullptr);
    return device && udevText(::udev_device_get_subsystem(device.get())) == kNodeSubsystem ? NodeKind::Hidraw
                                                                                           : NodeKind::Other;
}

DeviceMonitor::DeviceMonitor(DeviceFilter wanted, DeviceListener &listener, MonitorSource source)
    : _source(source), _tracker(std::move(wanted), listener),
      _udev(new Udev{{source, {kNodeSubsystem, kHidSubsystem}}}) {}

DeviceMonitor::~DeviceMonitor() = default;

int DeviceMonitor::descriptor() const noexcept { return _udev->events.descriptor(); }

void DeviceMonitor::scan() { _tracker.replaceAll(presentDevices(_udev->events, _source)); }

void DeviceMonitor::receive() {
    if (!_udev->events.receive([this](udev_device *device) { handle(device, _tracker, _source); }))
        scan();
}

} // namespace ZorvaTouch::Linux

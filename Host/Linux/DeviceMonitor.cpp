#include "Host/Linux/DeviceMonitor.h"

#include <libudev.h>
#include <unistd.h>

#include <cerrno>
#include <optional>
#include <string>
#include <string_view>
#include <system_error>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

constexpr const char *kUdevdSocket = "/run/udev/control";
constexpr const char *kNodeSubsystem = "hidraw";
constexpr const char *kHidSubsystem = "hid";

/// Lets go of libudev's objects.
struct Unref {
    void operator()(udev *object) const noexcept { ::udev_unref(object); }
    void operator()(udev_device *object) const noexcept { ::udev_device_unref(object); }
    void operator()(udev_enumerate *object) const noexcept { ::udev_enumerate_unref(object); }
    void operator()(udev_monitor *object) const noexcept { ::udev_monitor_unref(object); }
};
template <typename Object> using Owned = std::unique_ptr<Object, Unref>;

/// A pointer that is not null.
template <typename Object> Object *require(Object *object, const char *operation) {
    if (!object)
        throw std::system_error(errno, std::generic_category(), operation);
    return object;
}

/// libudev's results: negative ones are an errno.
void require(int result, const char *operation) {
    if (result < 0)
        throw std::system_error(-result, std::generic_category(), operation);
}

std::string textOf(const char *text) { return text ? text : ""; }

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
    return makeIdentity(textOf(::udev_device_get_devnode(node)), textOf(::udev_device_get_syspath(node)),
                        textOf(::udev_device_get_syspath(hid)), propertiesOf(hid));
}

/// Whether udevd is through with a node, or we need not wait for that.
bool hasPermissions(udev_device *node) noexcept {
    const char *const path = ::udev_device_get_devnode(node);
    return ::udev_device_get_is_initialized(node) > 0 || (path && ::access(path, R_OK) == 0);
}

/// Whether a node can be told of: its driver is there, and it may be opened. The driver is there, too, for
/// the few milliseconds that it is still at work.
bool isReady(udev_device *node, MonitorSource source) noexcept {
    udev_device *const hid = hidOf(node);
    return hid && ::udev_device_get_driver(hid) && (source == MonitorSource::Kernel || hasPermissions(node));
}

void handle(udev_device *device, DeviceTracker &tracker, MonitorSource source) {
    const std::string action = textOf(::udev_device_get_action(device));
    const std::string syspath = textOf(::udev_device_get_syspath(device));
    const bool isNode = textOf(::udev_device_get_subsystem(device)) == kNodeSubsystem;
    if (!isNode && action == "bind")
        tracker.bound(syspath);
    else if (isNode && action == "remove")
        tracker.removed(syspath);
    else if (isNode && action == "add")
        if (const auto identity = identityOf(device))
            tracker.added(*identity, source == MonitorSource::Udev);
}

Owned<udev_monitor> makeMonitor(udev *context, MonitorSource source) {
    const char *const name = source == MonitorSource::Udev ? "udev" : "kernel";
    Owned<udev_monitor> monitor(
        require(::udev_monitor_new_from_netlink(context, name), "listen to device events"));
    for (const char *const subsystem : {kNodeSubsystem, kHidSubsystem})
        require(::udev_monitor_filter_add_match_subsystem_devtype(monitor.get(), subsystem, nullptr),
                "filter device events");
    require(::udev_monitor_enable_receiving(monitor.get()), "listen to device events");
    return monitor;
}

} // namespace

struct DeviceMonitor::Udev {
    explicit Udev(MonitorSource source)
        : context(require(::udev_new(), "use udev")), monitor(makeMonitor(context.get(), source)) {}

    /// The nodes that are there and ready; of the others there will be word.
    [[nodiscard]] std::vector<DeviceIdentity> present(MonitorSource source) const;

    const Owned<udev> context;
    const Owned<udev_monitor> monitor;
};

std::vector<DeviceIdentity> DeviceMonitor::Udev::present(MonitorSource source) const {
    const Owned<udev_enumerate> list(require(::udev_enumerate_new(context.get()), "list devices"));
    require(::udev_enumerate_add_match_subsystem(list.get(), kNodeSubsystem), "list devices");
    require(::udev_enumerate_scan_devices(list.get()), "list devices");
    std::vector<DeviceIdentity> devices;
    for (udev_list_entry *entry = ::udev_enumerate_get_list_entry(list.get()); entry;
         entry = ::udev_list_entry_get_next(entry)) {
        const Owned<udev_device> node(
            ::udev_device_new_from_syspath(context.get(), ::udev_list_entry_get_name(entry)));
        if (!node || !isReady(node.get(), source))
            continue;
        if (auto identity = identityOf(node.get()))
            devices.push_back(std::move(*identity));
    }
    return devices;
}

MonitorSource detectMonitorSource() noexcept {
    return ::access(kUdevdSocket, F_OK) == 0 ? MonitorSource::Udev : MonitorSource::Kernel;
}

DeviceMonitor::DeviceMonitor(std::vector<HidId> wanted, DeviceListener &listener, MonitorSource source)
    : _source(source), _tracker(std::move(wanted), listener), _udev(std::make_unique<Udev>(source)) {}

DeviceMonitor::~DeviceMonitor() = default;

int DeviceMonitor::descriptor() const noexcept { return ::udev_monitor_get_fd(_udev->monitor.get()); }

void DeviceMonitor::scan() { _tracker.replaceAll(_udev->present(_source)); }

void DeviceMonitor::receive() {
    for (;;) {
        errno = 0;
        const Owned<udev_device> device(::udev_monitor_receive_device(_udev->monitor.get()));
        if (!device) {
            if (errno == ENOBUFS)
                scan();
            return; // what did not match the filter ends here, too
        }
        handle(device.get(), _tracker, _source);
    }
}

} // namespace ZorvaTouch::Linux

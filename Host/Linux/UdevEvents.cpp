#include "Host/Linux/UdevEvents.h"

#include <unistd.h>

#include <cerrno>
#include <system_error>

namespace ZorvaTouch::Linux {
namespace {

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

UdevOwned<udev_monitor> makeMonitor(udev *context, MonitorSource source,
                                    std::initializer_list<const char *> subsystems) {
    const char *const name = source == MonitorSource::Udev ? "udev" : "kernel";
    UdevOwned<udev_monitor> monitor(
        require(::udev_monitor_new_from_netlink(context, name), "listen to device events"));
    for (const char *const subsystem : subsystems)
        require(::udev_monitor_filter_add_match_subsystem_devtype(monitor.get(), subsystem, nullptr),
                "filter device events");
    require(::udev_monitor_enable_receiving(monitor.get()), "listen to device events");
    return monitor;
}

} // namespace

UdevEvents::UdevEvents(MonitorSource source, std::initializer_list<const char *> subsystems)
    : _context(require(::udev_new(), "use udev")), _monitor(makeMonitor(_context.get(), source, subsystems)) {
}

void UdevEvents::visitPresent(const char *subsystem, const Visit &visit) const {
    const UdevOwned<udev_enumerate> list(require(::udev_enumerate_new(_context.get()), "list devices"));
    require(::udev_enumerate_add_match_subsystem(list.get(), subsystem), "list devices");
    require(::udev_enumerate_scan_devices(list.get()), "list devices");
    for (udev_list_entry *entry = ::udev_enumerate_get_list_entry(list.get()); entry;
         entry = ::udev_list_entry_get_next(entry)) {
        const UdevOwned<udev_device> device(
            ::udev_device_new_from_syspath(_context.get(), ::udev_list_entry_get_name(entry)));
        if (device)
            visit(device.get());
    }
}

int UdevEvents::descriptor() const noexcept { return ::udev_monitor_get_fd(_monitor.get()); }

bool UdevEvents::receive(const Visit &visit) const {
    for (;;) {
        errno = 0;
        const UdevOwned<udev_device> device(::udev_monitor_receive_device(_monitor.get()));
        if (!device)
            return errno != ENOBUFS; // what did not match the filter ends here, too
        visit(device.get());
    }
}

bool hasUdevPermissions(udev_device *node) noexcept {
    const char *const path = ::udev_device_get_devnode(node);
    return ::udev_device_get_is_initialized(node) > 0 || (path && ::access(path, R_OK) == 0);
}

} // namespace ZorvaTouch::Linux

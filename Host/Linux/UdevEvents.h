#pragma once

#include "Host/Linux/DeviceMonitor.h"

#include <libudev.h>

#include <functional>
#include <initializer_list>
#include <memory>
#include <string>

namespace ZorvaTouch::Linux {

/// Lets go of libudev's objects.
struct UdevUnref {
    void operator()(udev *object) const noexcept { ::udev_unref(object); }
    void operator()(udev_device *object) const noexcept { ::udev_device_unref(object); }
    void operator()(udev_enumerate *object) const noexcept { ::udev_enumerate_unref(object); }
    void operator()(udev_monitor *object) const noexcept { ::udev_monitor_unref(object); }
};
template <typename Object> using UdevOwned = std::unique_ptr<Object, UdevUnref>;

/// The system's devices and what happens to them, as libudev has it.
///
/// Threads: one at a time.
class UdevEvents {
public:
    using Visit = std::function<void(udev_device *device)>; ///< borrowed for the call

    /// Listens from now on to what happens to devices of these subsystems.
    /// @throws std::system_error
    UdevEvents(MonitorSource source, std::initializer_list<const char *> subsystems);

    /// Visits all devices of a subsystem that are there, ordered by nothing in particular.
    /// @throws std::system_error, and what the visit throws
    void visitPresent(const char *subsystem, const Visit &visit) const;

    /// Readable when there is something for `receive`.
    [[nodiscard]] int descriptor() const noexcept;
    /// Visits what has come in; never blocks, and there may be nothing.
    /// @return False: some was lost.
    [[nodiscard]] bool receive(const Visit &visit) const;

private:
    const UdevOwned<udev> _context;
    const UdevOwned<udev_monitor> _monitor;
};

/// What libudev says, with null as an empty text.
/// @throws std::bad_alloc
[[nodiscard]] inline std::string udevText(const char *text) { return text ? text : ""; }

/// Whether udevd is through with a node, or we need not wait for that.
[[nodiscard]] bool hasUdevPermissions(udev_device *node) noexcept;

} // namespace ZorvaTouch::Linux

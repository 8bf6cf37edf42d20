#pragma once

#include "Host/Linux/DeviceTracker.h"

#include <memory>
#include <vector>

namespace ZorvaTouch::Linux {

/// Who says that devices come and go.
enum class MonitorSource {
    Udev,   ///< udevd, when it has run its rules: the node has its permissions
    Kernel, ///< the kernel itself; for systems without udevd
};

/// `Udev` where udevd runs.
[[nodiscard]] MonitorSource detectMonitorSource() noexcept;

/// What is under a path.
enum class NodeKind {
    Missing,
    Hidraw, ///< a hidraw device node, or a link to one
    Other,
};

/// Opens nothing.
/// @throws std::system_error  The path cannot be examined; `what` begins with it.
/// @throws std::bad_alloc
[[nodiscard]] NodeKind nodeKindOf(const std::string &path);

/// Finds hidraw devices of some makes, those that are there and those that come, and tells when they go.
///
/// Threads: one at a time; the listener is called on the one that calls.
class DeviceMonitor {
public:
    /// Listens from now on; nothing is told yet.
    /// @param listener  Borrowed; outlives this.
    /// @throws std::system_error  There is no monitor to be had.
    /// @throws std::bad_alloc
    DeviceMonitor(DeviceFilter wanted, DeviceListener &listener,
                  MonitorSource source = detectMonitorSource());
    ~DeviceMonitor();
    DeviceMonitor(const DeviceMonitor &) = delete;
    DeviceMonitor &operator=(const DeviceMonitor &) = delete;

    /// Tells what has changed since the last time: at first, of all that is there. Nothing is missed between
    /// this and `receive`, nor told twice.
    /// @throws std::system_error  The system's devices cannot be listed.
    /// @throws std::bad_alloc
    void scan();

    /// Readable when there is something for `receive`. Stays the monitor's.
    [[nodiscard]] int descriptor() const noexcept;
    /// Tells all that has come in; never blocks, and there may be nothing. When messages were lost it scans.
    /// @throws as `scan`
    void receive();

    [[nodiscard]] MonitorSource source() const noexcept { return _source; }

private:
    struct Udev;
    const MonitorSource _source;
    DeviceTracker _tracker;
    const std::unique_ptr<Udev> _udev;
};

} // namespace ZorvaTouch::Linux

#pragma once

#include "Host/Linux/AccelIdentity.h"
#include "Host/Linux/DeviceMonitor.h"

#include <memory>
#include <string_view>
#include <vector>

namespace ZorvaTouch::Linux {

/// Finds accelerometers, IIO devices whose scans have an acceleration, those that are there and those that
/// come, and tells when they go.
///
/// Threads: one at a time; the listener is called on the one that calls. What it throws gets through, after
/// the change was noted.
class AccelMonitor {
public:
    /// Listens from now on; nothing is told yet.
    /// @param listener  Borrowed; outlives this.
    /// @throws std::system_error  There is no monitor to be had.
    /// @throws std::bad_alloc
    explicit AccelMonitor(AccelListener &listener, MonitorSource source = detectMonitorSource());
    ~AccelMonitor();
    AccelMonitor(const AccelMonitor &) = delete;
    AccelMonitor &operator=(const AccelMonitor &) = delete;

    /// Tells what has changed since the last time, in the order of the syspaths: at first, of all that is
    /// there. Nothing is missed between this and `receive`, nor told twice.
    /// @throws std::system_error  The system's devices cannot be listed.
    /// @throws std::bad_alloc
    void scan();

    /// Readable when there is something for `receive`. Stays the monitor's.
    [[nodiscard]] int descriptor() const noexcept;
    /// Tells all that has come in; never blocks, and there may be nothing. When messages were lost it scans.
    /// @throws as `scan`
    void receive();

private:
    struct Udev;

    void added(const AccelIdentity &accelerometer);
    void removed(std::string_view syspath);
    [[nodiscard]] std::vector<AccelIdentity> present() const;

    AccelListener &_listener;
    const MonitorSource _source;
    const std::unique_ptr<Udev> _udev;
    std::vector<AccelIdentity> _known;
};

} // namespace ZorvaTouch::Linux

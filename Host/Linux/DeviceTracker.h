#pragma once

#include "Host/Linux/DeviceIdentity.h"

#include <string_view>
#include <vector>

namespace ZorvaTouch::Linux {

/// Hears of devices that come and go, each once.
class DeviceListener {
public:
    virtual ~DeviceListener() = default;
    /// The device is there, and its reports get through.
    virtual void onAdded(const DeviceIdentity &device) = 0;
    /// It is no longer there; only for a device that was added.
    virtual void onRemoved(const DeviceIdentity &device) = 0;
    /// Something about it has changed, its permissions say; only for a device that was added.
    virtual void onChanged(const DeviceIdentity & /*device*/) {}
};

/// Which devices are wanted: those of some makes, and those under some paths.
struct DeviceFilter {
    std::vector<HidId> ids;
    std::vector<std::string> nodes; ///< "/dev/hidraw0", or links to such; followed when a device comes

    [[nodiscard]] bool matches(const DeviceIdentity &device) const;
};

/// Keeps track of the devices that are wanted, from what the system says happened to any device.
///
/// The kernel announces a node before the device's driver has finished with it, and loses reports that come
/// in between. So a node may be there and not be told of yet.
///
/// Threads: one at a time. What a listener throws gets through, after the change was noted.
class DeviceTracker {
public:
    /// @param listener  Borrowed; outlives this.
    DeviceTracker(DeviceFilter wanted, DeviceListener &listener);

    /// A node is there. One that is known is left as it is, but for becoming ready.
    /// @param isReady  Whether its reports get through already.
    void added(const DeviceIdentity &device, bool isReady);
    /// The driver has finished with a HID device: its nodes are ready.
    void bound(std::string_view hidSyspath);
    /// Something about a node has changed.
    void changed(std::string_view syspath);
    /// A node is gone.
    void removed(std::string_view syspath);
    /// The nodes that are there, all of them ready; others that were told of are gone, and those that were
    /// not may still become ready.
    void replaceAll(const std::vector<DeviceIdentity> &present);

private:
    struct Entry {
        DeviceIdentity device;
        bool isTold = false;
    };

    [[nodiscard]] std::vector<Entry>::iterator find(std::string_view syspath);
    void tell(Entry &entry);

    const DeviceFilter _wanted;
    DeviceListener &_listener;
    std::vector<Entry> _entries;
};

} // namespace ZorvaTouch::Linux

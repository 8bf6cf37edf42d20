#include "Host/Linux/DeviceTracker.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Linux {

DeviceTracker::DeviceTracker(std::vector<HidId> wanted, DeviceListener &listener)
    : _wanted(std::move(wanted)), _listener(listener) {}

void DeviceTracker::added(const DeviceIdentity &device, bool isReady) {
    if (!isWanted(device))
        return;
    auto entry = find(device.syspath);
    if (entry == _entries.end())
        entry = _entries.insert(_entries.end(), {.device = device});
    if (isReady)
        tell(*entry);
}

void DeviceTracker::bound(std::string_view hidSyspath) {
    for (std::size_t i = 0; i < _entries.size(); ++i)
        if (_entries[i].device.hidSyspath == hidSyspath)
            tell(_entries[i]);
}

void DeviceTracker::removed(std::string_view syspath) {
    const auto found = find(syspath);
    if (found == _entries.end())
        return;
    const Entry entry = std::move(*found);
    _entries.erase(found);
    if (entry.isTold)
        _listener.onRemoved(entry.device);
}

void DeviceTracker::replaceAll(const std::vector<DeviceIdentity> &present) {
    const auto isPresent = [&](const Entry &entry) {
        return std::ranges::find(present, entry.device) != present.end();
    };
    std::vector<std::string> gone;
    for (const Entry &entry : _entries)
        if (entry.isTold && !isPresent(entry))
            gone.push_back(entry.device.syspath);
    for (const std::string &syspath : gone)
        removed(syspath);
    for (const DeviceIdentity &device : present)
        added(device, true);
}

bool DeviceTracker::isWanted(const DeviceIdentity &device) const {
    return std::ranges::find(_wanted, device.id) != _wanted.end();
}

std::vector<DeviceTracker::Entry>::iterator DeviceTracker::find(std::string_view syspath) {
    return std::ranges::find_if(_entries,
                                [&](const Entry &entry) { return entry.device.syspath == syspath; });
}

void DeviceTracker::tell(Entry &entry) {
    if (std::exchange(entry.isTold, true))
        return;
    const DeviceIdentity device = entry.device; // the listener may call back
    _listener.onAdded(device);
}

} // namespace ZorvaTouch::Linux

#include "Host/Linux/DeviceTracker.h"

#include <algorithm>
#include <filesystem>
#include <system_error>
#include <utility>

namespace ZorvaTouch::Linux {

bool DeviceFilter::matches(const DeviceIdentity &device) const {
    const auto isDevice = [&](const std::string &node) {
        std::error_code error;
        return node == device.devnode || std::filesystem::canonical(node, error) == device.devnode;
    };
    return std::ranges::find(ids, device.id) != ids.end() || std::ranges::any_of(nodes, isDevice);
}

DeviceTracker::DeviceTracker(DeviceFilter wanted, DeviceListener &listener)
    : _wanted(std::move(wanted)), _listener(listener) {}

void DeviceTracker::added(const DeviceIdentity &device, bool isReady) {
    if (!_wanted.matches(device))
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

void DeviceTracker::changed(std::string_view syspath) {
    const auto found = find(syspath);
    if (found == _entries.end() || !found->isTold)
        return;
    const DeviceIdentity device = found->device; // the listener may call back
    _listener.onChanged(device);
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

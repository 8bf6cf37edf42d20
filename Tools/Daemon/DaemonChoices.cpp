#include "Tools/Daemon/DaemonChoices.h"

#include "Host/Linux/DeviceMonitor.h"

#include <algorithm>
#include <stdexcept>
#include <string>
#include <variant>

namespace ZorvaTouch::Tools {

Linux::DeviceFilter deviceFilterOf(const DaemonOptions &options) {
    Linux::DeviceFilter filter;
    if (options.devices.empty())
        filter.ids = options.ids;
    for (const DeviceOption &device : options.devices)
        if (const auto *const path = std::get_if<std::string>(&device))
            filter.nodes.push_back(*path);
    return filter;
}

void requireNodes(const Linux::DeviceFilter &filter) {
    for (const std::string &node : filter.nodes)
        if (Linux::nodeKindOf(node) == Linux::NodeKind::Other)
            throw std::runtime_error(node + ": must be a hidraw device node, as /dev/hidraw0 is");
}

bool pressesKeys(const DaemonOptions &options) {
    const auto isNode = [](const DeviceOption &device) {
        return std::holds_alternative<std::string>(device);
    };
    const bool hasRealSurfaces = options.devices.empty() || std::ranges::any_of(options.devices, isNode);
    return options.sendsKeys && (hasRealSurfaces || options.sendsSimulatedKeys);
}

Linux::AccelChoice accelChoiceOf(const AccelOption &option) {
    switch (option.choice) {
    case AccelOption::Choice::Any:
        return Linux::AccelChoice::any();
    case AccelOption::Choice::None:
        return Linux::AccelChoice::none();
    case AccelOption::Choice::Named:
        return Linux::AccelChoice::named(option.name);
    }
    return Linux::AccelChoice::none();
}

} // namespace ZorvaTouch::Tools

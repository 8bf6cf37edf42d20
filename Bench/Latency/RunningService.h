#pragma once

#include "Bench/Latency/BenchPlatform.h"
#include "Bench/Latency/LinkDevice.h"
#include "Host/Runtime/SerialQueue.h"
#include "Service/ZorvaTouchHIDService.h"

namespace ZorvaTouch::Bench {

/// A service that reads from a link, from construction to destruction, driven through its tables.
class RunningService {
public:
    /// @param callback  Gets the events, with `target`.
    RunningService(const Link &link, ReportObserver &observer, bool realTime, ZorvaEventCallback callback,
                   void *target);
    ~RunningService();
    RunningService(const RunningService &) = delete;
    RunningService &operator=(const RunningService &) = delete;

    [[nodiscard]] Ref<const ZorvaValue> copyProperty(const char *key) const {
        return Ref<const ZorvaValue>::adopt((*_hid)->copyProperty(_hid, key));
    }

private:
    BenchPlatform _platform;
    Host::SerialQueue _queue;
    Ref<ZorvaService> _offered;
    PlugInInterfaceTable **_plugIn;
    HidServiceInterfaceTable **_hid;
};

} // namespace ZorvaTouch::Bench

#pragma once

#include "Plugin/Ref.h"
#include "Plugin/ZorvaPlugIn.h"

namespace ZorvaTouch {

/// Where a service's events go.
struct DispatchEventInfo {
    Ref<ZorvaQueue> queue;                 ///< the host's serial queue; null while nothing is scheduled
    ZorvaEventCallback callback = nullptr; ///< the host's
    void *target = nullptr;                ///< the host's, opaque
    void *refcon = nullptr;                ///< the host's, opaque
    void *sender = nullptr;                ///< the service's interface pointer; not counted
};

} // namespace ZorvaTouch

#pragma once

#include "Bench/Latency/Link.h"
#include "Plugin/BoundaryObject.h"

#include <span>

namespace ZorvaTouch::Bench {

/// Told about each report on the input thread.
class ReportObserver {
public:
    virtual ~ReportObserver() = default;
    virtual void reportRead() = 0;    ///< before the service's callback
    virtual void reportHandled() = 0; ///< after it
};

/// A service of the host with one device, which reads its reports from a link. Reading allocates nothing.
/// @param link, observer  Borrowed, for the life of the service.
[[nodiscard]] Ref<ZorvaService> makeLinkService(const Link &link, ReportObserver &observer);

} // namespace ZorvaTouch::Bench

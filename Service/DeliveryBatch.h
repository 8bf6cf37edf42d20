#pragma once

#include "Host/Interface/Platform.h"
#include "Plugin/ZorvaHIDService.h"
#include "Service/DispatchEventInfo.h"
#include "Service/ServiceLog.h"
#include "Shared/HostEvent.h"

#include <memory>

namespace ZorvaTouch {

/// The events of one report on their way from the input-report thread to the host's callback.
///
/// It holds all that its delivery needs, the service included: it arrives even if the service has been
/// unscheduled and released meanwhile.
class DeliveryBatch {
public:
    DeliveryBatch(ZorvaHIDService &service, const ServiceLog &log, Host::TraceSink &trace,
                  HostEventList events, const DispatchEventInfo &info);

    /// Hands a batch to its queue and returns at once.
    ///
    /// Threads: the input-report thread.
    /// @throws std::runtime_error  There is no queue, or it refused; the batch is lost.
    static void submit(std::unique_ptr<DeliveryBatch> batch);

private:
    static void run(void *context) noexcept;
    static void discard(void *context) noexcept;
    void deliver() const noexcept;
    void deliver(const std::shared_ptr<HostEvent> &event) const;

    ServiceReference<ZorvaHIDService> _service; // first: the log and the trace sink may live no longer
    ServiceLog _log;
    Host::TraceSink *_trace;
    HostEventList _events;
    DispatchEventInfo _info;
};

} // namespace ZorvaTouch

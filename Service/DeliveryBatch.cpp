#include "Service/DeliveryBatch.h"

#include "Plugin/EventObject.h"

#include <memory>
#include <stdexcept>
#include <utility>

namespace ZorvaTouch {

DeliveryBatch::DeliveryBatch(ZorvaHIDService &service, const ServiceLog &log, Host::TraceSink &trace,
                             HostEventList events, const DispatchEventInfo &info)
    : _service(service), _log(log), _trace(&trace), _events(std::move(events)), _info(info) {}

void DeliveryBatch::submit(std::unique_ptr<DeliveryBatch> batch) {
    ZorvaQueue *const queue = batch->_info.queue.get();
    if (!queue)
        throw std::runtime_error("there is no queue");
    // Before it is known whether the queue took it, it may have been run and be gone; but then it was taken.
    DeliveryBatch *const submitted = batch.release();
    if (!queue->table->submit(queue, run, discard, submitted)) {
        batch.reset(submitted);
        throw std::runtime_error("the queue refused");
    }
}

void DeliveryBatch::run(void *context) noexcept {
    const std::unique_ptr<const DeliveryBatch> batch(static_cast<DeliveryBatch *>(context));
    batch->deliver();
}

void DeliveryBatch::discard(void *context) noexcept { delete static_cast<DeliveryBatch *>(context); }

void DeliveryBatch::deliver() const noexcept {
    _trace->emit(Host::Trace::kDispatchLand, _events.size());
    _log.debug("Dispatch {} event(s) land", _events.size());
    for (const std::shared_ptr<HostEvent> &event : _events)
        runGuarded(_log, "delivery", [&] { deliver(event); });
}

void DeliveryBatch::deliver(const std::shared_ptr<HostEvent> &event) const {
    _trace->emit(Host::Trace::kDispatchEvent, static_cast<std::uint64_t>(event->type()), event->phase());
    if (_log.isEnabled(Ports::LogLevel::Default))
        _log.notice("Dispatch event: {}", jsonText(*event));
    if (_info.callback)
        _info.callback(_info.target, _info.refcon, _info.sender, makeEvent(event).get(), 0);
}

} // namespace ZorvaTouch

#include "Host/Objects/LoopSource.h"

#include <utility>

namespace ZorvaTouch::Host {

void LoopSource::schedule(ZorvaRunLoop *loop, const char *mode, ZorvaFunction perform, void *context) {
    _mode = mode;
    _loop = Ref<ZorvaRunLoop>::retain(loop);
    _perform = perform;
    _context = context;
}

Ref<ZorvaRunLoop> LoopSource::unschedule() noexcept {
    disconnect();
    return std::move(_loop);
}

bool LoopSource::isScheduledOn(const ZorvaRunLoop *loop, const char *mode) const noexcept {
    return isScheduled() && _loop.get() == loop && _mode == mode;
}

void LoopSource::connect() noexcept {
    if (isScheduled() && !isConnected())
        _source = _loop->table->addSource(_loop.get(), _mode.c_str(), _perform, _context);
}

void LoopSource::disconnect() noexcept {
    if (const std::uint64_t source = std::exchange(_source, 0))
        _loop->table->removeSource(_loop.get(), source);
}

void LoopSource::signal() noexcept {
    if (isConnected())
        _loop->table->signalSource(_loop.get(), _source);
}

} // namespace ZorvaTouch::Host

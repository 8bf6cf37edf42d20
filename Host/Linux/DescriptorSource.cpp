#include "Host/Linux/DescriptorSource.h"

#include <utility>

namespace ZorvaTouch::Linux {

void DescriptorSource::schedule(ZorvaRunLoop *loop, const char *mode) {
    _mode = mode;
    _loop = Ref<ZorvaRunLoop>::retain(loop);
}

Ref<ZorvaRunLoop> DescriptorSource::unschedule() noexcept {
    disconnect();
    return std::move(_loop);
}

bool DescriptorSource::isScheduledOn(const ZorvaRunLoop *loop, const char *mode) const noexcept {
    return isScheduled() && _loop.get() == loop && mode && _mode == mode;
}

bool DescriptorSource::connect(int descriptor, ZorvaFunction perform, void *context) noexcept {
    if (!isScheduled())
        return true;
    _source = _loop->table->addDescriptor(_loop.get(), _mode.c_str(), descriptor, perform, context);
    return _source != 0;
}

void DescriptorSource::disconnect() noexcept {
    if (const std::uint64_t source = std::exchange(_source, 0))
        _loop->table->removeSource(_loop.get(), source);
}

} // namespace ZorvaTouch::Linux

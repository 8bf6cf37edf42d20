#include "Plugin/ZorvaHIDService.h"

#include "Plugin/ZorvaIUnknown.h"

#include <memory>

namespace ZorvaTouch {

ZorvaHIDService::ZorvaHIDService() {
    auto pluginTable = std::make_unique<PlugInInterfaceTable>(ZorvaIUnknown::plugInTable(*this));
    auto serviceTable = std::make_unique<HidServiceInterfaceTable>(ZorvaIUnknown::hidServiceTable(*this));
    _pluginInterface = pluginTable.release();
    _serviceInterface = serviceTable.release();
}

ZorvaHIDService::~ZorvaHIDService() {
    delete std::exchange(_serviceInterface, nullptr);
    delete std::exchange(_pluginInterface, nullptr);
}

std::uint32_t ZorvaHIDService::release() noexcept {
    const std::uint32_t left = _references.release();
    if (left == 0)
        delete this;
    return left;
}

ZorvaStatus ZorvaHIDService::probeWithService(ZorvaService * /*service*/, const ZorvaValue * /*properties*/,
                                              std::int32_t * /*outScore*/) {
    return ZORVA_STATUS_UNSUPPORTED;
}

ZorvaStatus ZorvaHIDService::startWithService(ZorvaService * /*service*/, const ZorvaValue * /*properties*/) {
    return ZORVA_STATUS_UNSUPPORTED;
}

ZorvaStatus ZorvaHIDService::stop() { return ZORVA_STATUS_UNSUPPORTED; }

bool ZorvaHIDService::openWithOptions(std::uint32_t /*options*/) { return false; }

void ZorvaHIDService::closeWithOptions(std::uint32_t /*options*/) {}

PropertyValue ZorvaHIDService::getPropertyForKey(const char * /*key*/) { return {}; }

bool ZorvaHIDService::setPropertyForKey(const PropertyValue & /*value*/, const char * /*key*/) {
    return false;
}

void ZorvaHIDService::setEventCallback(ZorvaEventCallback /*callback*/, void * /*target*/,
                                       void * /*refcon*/) {}

void ZorvaHIDService::scheduleWithDispatchQueue(ZorvaQueue * /*queue*/) {}

void ZorvaHIDService::unscheduleWithDispatchQueue(ZorvaQueue * /*queue*/) {}

Ref<const ZorvaEvent> ZorvaHIDService::copyEventWithType(std::uint32_t /*type*/,
                                                         const ZorvaEvent * /*matching*/,
                                                         std::uint32_t /*options*/) {
    return {};
}

ZorvaStatus ZorvaHIDService::setOutputEvent(const ZorvaEvent * /*event*/) { return ZORVA_STATUS_UNSUPPORTED; }

void ZorvaHIDService::reportFailure(const char * /*operation*/, const char * /*reason*/) noexcept {}

} // namespace ZorvaTouch

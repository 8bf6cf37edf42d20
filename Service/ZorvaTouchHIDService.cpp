#include "Service/ZorvaTouchHIDService.h"

#include "Plugin/ObjectCheck.h"
#include "Shared/LogNames.h"

namespace ZorvaTouch {

ZorvaTouchHIDService::ZorvaTouchHIDService(Host::Platform &platform)
    : _platform(platform), _log(platform.logs().openLog(kLogSubsystem, kLogCategoryService)),
      _pipeline(std::make_shared<Pipeline>(platform.logs())), _recording(platform.clock()) {
    _recording.pipeline = _pipeline;
    _recording.setMaxFrameCount(kMaxRecordedFrames);
}

ZorvaTouchHIDService::~ZorvaTouchHIDService() {
    _log.debug("{}", "dealloc");
    // The thread holds a reference, so it is at its end: it may be the one that is here.
    if (_inputReportThread && !_inputReportThread->isCurrent())
        _inputReportThread->join();
}

ZorvaStatus ZorvaTouchHIDService::probeWithService(ZorvaService * /*service*/,
                                                   const ZorvaValue * /*properties*/,
                                                   std::int32_t * /*outScore*/) {
    _log.debug("{}", "probeWithService:properties:outScore:");
    return ZORVA_STATUS_SUCCESS; // the score stays the host's
}

ZorvaStatus ZorvaTouchHIDService::startWithService(ZorvaService *service, const ZorvaValue * /*properties*/) {
    _log.debug("{}", "startWithService:properties:");
    _zorvaDevice = HostHidDevice::create(service);
    _eventSystem = isComplete(service) ? Ref<ZorvaService>::retain(service) : Ref<ZorvaService>();
    return _zorvaDevice ? ZORVA_STATUS_SUCCESS : ZORVA_STATUS_NO_RESOURCES;
}

ZorvaStatus ZorvaTouchHIDService::stop() {
    _log.debug("{}", "stop");
    _zorvaDevice.reset();
    _eventSystem.reset();
    return ZORVA_STATUS_SUCCESS;
}

bool ZorvaTouchHIDService::openWithOptions(std::uint32_t options) {
    _log.debug("openWithOptions:{:x}", options);
    return _zorvaDevice.open(options);
}

void ZorvaTouchHIDService::closeWithOptions(std::uint32_t options) {
    _log.debug("closeWithOptions:{:x}", options);
    _zorvaDevice.close(options);
}

void ZorvaTouchHIDService::setEventCallback(ZorvaEventCallback callback, void *target, void *refcon) {
    _log.debug("{}", "setEventCallback:target:refcon:");
    _dispatchEventInfo.callback = callback;
    _dispatchEventInfo.target = target;
    _dispatchEventInfo.refcon = refcon;
}

Ref<const ZorvaEvent> ZorvaTouchHIDService::copyEventWithType(std::uint32_t /*type*/,
                                                              const ZorvaEvent * /*matching*/,
                                                              std::uint32_t /*options*/) {
    _log.debug("{}", "copyEventWithType:matching:options:");
    return {};
}

ZorvaStatus ZorvaTouchHIDService::setOutputEvent(const ZorvaEvent * /*event*/) {
    _log.debug("{}", "setOutputEvent:");
    return ZORVA_STATUS_UNSUPPORTED;
}

void ZorvaTouchHIDService::reportFailure(const char *operation, const char *reason) noexcept {
    _log.error("{} failed: {}", operation, reason);
}

} // namespace ZorvaTouch

#include "Bench/Latency/RunningService.h"

namespace ZorvaTouch::Bench {

RunningService::RunningService(const Link &link, ReportObserver &observer, bool realTime,
                               ZorvaEventCallback callback, void *target)
    : _platform(realTime),
      _queue("bench-queue", realTime ? ZorvaTouchHIDService::kInputReportThreadPriority : 0),
      _offered(makeLinkService(link, observer)) {
    auto *const service = new ZorvaTouchHIDService(_platform);
    _plugIn = service->getPluginInterface();
    _hid = service->getServiceInterface();
    (*_plugIn)->Start(_plugIn, nullptr, _offered.get());
    (*_hid)->open(_hid, 0);
    (*_hid)->setEventCallback(_hid, callback, target, nullptr);
    (*_hid)->scheduleWithDispatchQueue(_hid, _queue.boundary());
}

RunningService::~RunningService() {
    (*_hid)->unscheduleFromDispatchQueue(_hid, nullptr);
    _queue.drain();
    (*_hid)->close(_hid, 0);
    (*_plugIn)->Stop(_plugIn);
    (*_plugIn)->Release(_plugIn);
}

} // namespace ZorvaTouch::Bench

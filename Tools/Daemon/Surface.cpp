#include "Tools/Daemon/Surface.h"

#include "Host/Objects/Service.h"
#include "Tools/Daemon/SurfaceObserver.h"

#include <cerrno>
#include <stdexcept>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

/// What a user can do about it.
std::string_view adviceFor(const Linux::SystemFailure &failure) noexcept {
    return failure.errorNumber == EACCES || failure.errorNumber == EPERM
               ? "; a udev rule gives access to it, see the manual"
               : "";
}

} // namespace

Surface::Surface(SurfaceSurroundings &surroundings, const SurfaceName &name, const DeviceMaker &maker,
                 Keyboard &keyboard, const std::shared_ptr<Host::EventSystem> &events,
                 std::function<void(const std::string &)> onLost)
    : _surroundings(surroundings), _name(name), _keyboard(keyboard),
      _observer(std::make_shared<Observer>(surroundings, std::move(onLost), [this] { watchSilence(); })),
      _service(surroundings.plugIn) {
    try {
        _service->start(Host::Service::create(maker(_observer), events).get());
    } catch (const HostingError &) {
        const auto failure = _observer->openFailure();
        if (!failure)
            throw;
        if (failure->errorNumber == EBUSY)
            throw SurfaceInUse(describe(*failure));
        throw std::runtime_error(describe(*failure).append(adviceFor(*failure)));
    }
    schedule();
}

Surface::~Surface() {
    stop();
    _service.reset(); // what is left in the queue belongs to the plug-in; there is nothing
}

void Surface::stop() {
    _observer->forget();
    _silence = {};
    unschedule(SurfaceEnd::Stopped);
}

void Surface::schedule() {
    _keys = std::make_shared<SurfaceKeys>(
        _name, _surroundings.keyMap, _keyboard, _surroundings.listener,
        [observer = _observer] { observer->tellHeld(); }, _surroundings.keyLimit);
    _observer->begin(_keys);
    _service->setEventCallback(SurfaceKeys::receive, _keys.get());
    try {
        _service->schedule(_surroundings.keyQueue.boundary());
    } catch (...) {
        _observer->finish();
        throw;
    }
}

void Surface::unschedule(SurfaceEnd end) {
    _observer->finish();
    _service->unschedule();
    letGo(end);
}

void Surface::letGo(SurfaceEnd end) {
    _surroundings.keyQueue.submit([keys = _keys, end] { keys->end(end); });
    _surroundings.keyQueue.drain();
}

void Surface::reschedule() {
    unschedule(SurfaceEnd::Unscheduled);
    schedule();
}

void Surface::watchSilence() {
    _reportsHeard = _observer->reports();
    _silence = _surroundings.later(kLongestSilence, [this] { checkSilence(); });
}

void Surface::checkSilence() {
    if (isIdle())
        return;
    if (_reportsHeard == 0 ||
        _reportsHeard != _observer->reports()) // none at all: a device that does not tell
        return watchSilence();
    _surroundings.log.error({_name.node, ": silent in the middle of a hold; its keys are let go of"});
    suspend();
}

void Surface::suspend() { letGo(SurfaceEnd::Suspended); }

std::optional<SurfaceRecording> Surface::recording() const {
    const auto recording = _service->property("Recording");
    const std::string *const text = recording ? recording->asString() : nullptr;
    if (!text)
        return std::nullopt;
    return SurfaceRecording{.text = *text,
                            .history = _observer->history(),
                            .notes = notesOf(*_service, _surroundings.savesSerial),
                            .timeNs = _observer->nowNs()};
}

} // namespace ZorvaTouch::Tools

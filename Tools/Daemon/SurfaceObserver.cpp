#include "Tools/Daemon/SurfaceObserver.h"

#include "Host/Interface/Platform.h"

#include <exception>
#include <string_view>
#include <utility>

namespace ZorvaTouch::Tools {

using Host::MutexLock;

Surface::Observer::Observer(SurfaceSurroundings &surroundings, OnLost onLost, std::function<void()> onHeld)
    : _surroundings(surroundings), _clock(Host::processPlatform().clock()), _ticks(_clock),
      _onHeld(std::move(onHeld)), _onLost(std::move(onLost)) {}

void Surface::Observer::begin(std::shared_ptr<SurfaceKeys> keys) {
    std::optional<Linux::SystemFailure> goneFor;
    {
        const MutexLock lock(_lock);
        _keys = std::move(keys);
        goneFor = _goneFor;
    }
    if (goneFor)
        onGone(*goneFor);
}

void Surface::Observer::finish() noexcept {
    std::shared_ptr<SurfaceKeys> keys; // let go of without the lock
    const MutexLock lock(_lock);
    keys.swap(_keys);
}

std::optional<Linux::SystemFailure> Surface::Observer::openFailure() const {
    const MutexLock lock(_lock);
    return _openFailure;
}

void Surface::Observer::tellHeld() noexcept {
    try {
        _surroundings.loop.post([self = shared_from_this()] {
            if (self->_onHeld)
                self->_onHeld();
        });
    } catch (const std::exception &) { // no memory: then nobody watches over this hold
    }
}

void Surface::Observer::onGone(const Linux::SystemFailure &reason) noexcept {
    {
        const MutexLock lock(_lock);
        _goneFor = reason;
    }
    lose(SurfaceEnd::DeviceGone, "the device is gone", &reason);
}

void Surface::Observer::onUnscheduled() noexcept {
    lose(SurfaceEnd::Unscheduled, "its input thread ended", nullptr);
}

void Surface::Observer::onFailure(const Linux::SystemFailure &failure) noexcept {
    if (std::string_view(failure.operation) != "open") {
        _surroundings.log.error("a report was lost", failure);
        return;
    }
    const MutexLock lock(_lock);
    _openFailure = failure;
}

void Surface::Observer::lose(SurfaceEnd end, const char *what, const Linux::SystemFailure *why) noexcept {
    std::shared_ptr<SurfaceKeys> keys;
    {
        const MutexLock lock(_lock);
        keys.swap(_keys);
    }
    if (!keys)
        return;
    try {
        _surroundings.keyQueue.submit([keys, end] { keys->end(end); });
        std::string reason = what;
        if (why)
            reason.append(" (").append(describe(*why)).append(")");
        _surroundings.loop.post([self = shared_from_this(), reason = std::move(reason)] {
            if (const auto onLost = std::exchange(self->_onLost, nullptr))
                onLost(reason);
        });
    } catch (const std::exception &) { // no memory: the device's removal, which the system tells, will do it
    }
}

} // namespace ZorvaTouch::Tools

#include "Tools/Daemon/SurfaceKeys.h"

#include "Plugin/EventObject.h"

#include <exception>
#include <utility>

namespace ZorvaTouch::Tools {

SurfaceKeys::SurfaceKeys(SurfaceName surface, const KeyMap &map, Keyboard &keyboard, DaemonListener &listener,
                         std::function<void()> onHeld, KeyLimit limit)
    : _surface(std::move(surface)), _mapper(map), _quarantine(limit.pressesPerSecond), _ticks(limit.ticks),
      _keyboard(keyboard), _listener(listener), _onHeld(std::move(onHeld)) {}

void SurfaceKeys::receive(void *target, void * /*refcon*/, void * /*sender*/, const ZorvaEvent *event,
                          std::uint32_t /*options*/) noexcept {
    SurfaceKeys &self = *static_cast<SurfaceKeys *>(target);
    try {
        if (const auto read = readEvent(event))
            self.handle(*read);
    } catch (const std::exception &) { // no memory for the event: what it may have ended must not stay down
        self.end(SurfaceEnd::Suspended);
    }
}

void SurfaceKeys::handle(const HostEvent &event) noexcept {
    _listener.onEvent(_surface, event);
    const auto [changes, transition] =
        _quarantine.filter(_mapper.handle(event), _ticks.nanosecondsFromMachTime(event.timestamp()));
    if (transition == KeyQuarantine::Transition::Ends)
        tellQuarantine(false);
    apply(&event, changes);
    if (transition == KeyQuarantine::Transition::Begins)
        tellQuarantine(true);
}

void SurfaceKeys::end(SurfaceEnd end) noexcept {
    apply(nullptr, _quarantine.filter(_mapper.handle(end), 0).changes);
    if (_mapper.state() == KeyMapper::State::Over && _quarantine.end())
        tellQuarantine(false);
}

void SurfaceKeys::tellQuarantine(bool begins) noexcept {
    _listener.onQuarantine(_surface, begins, _quarantine.suppressed());
}

void SurfaceKeys::apply(const HostEvent *cause, const KeyChanges &changes) noexcept {
    _keyboard.apply(_surface, cause, changes);
    const bool wasHeld = std::exchange(_isHeld, _quarantine.keyDown() != kNoKey);
    if (_onHeld && _isHeld && !wasHeld)
        _onHeld();
    _isIdle = _mapper.state() == KeyMapper::State::Idle || _mapper.state() == KeyMapper::State::Over;
}

} // namespace ZorvaTouch::Tools

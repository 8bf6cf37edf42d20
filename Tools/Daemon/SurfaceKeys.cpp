#include "Tools/Daemon/SurfaceKeys.h"

#include "Plugin/EventObject.h"

#include <exception>
#include <utility>

namespace ZorvaTouch::Tools {

SurfaceKeys::SurfaceKeys(SurfaceName surface, const KeyMap &map, Keyboard &keyboard, DaemonListener &listener,
                         std::function<void()> onHeld)
    : _surface(std::move(surface)), _mapper(map), _keyboard(keyboard), _listener(listener),
      _onHeld(std::move(onHeld)) {}

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
    apply(&event, _mapper.handle(event));
}

void SurfaceKeys::end(SurfaceEnd end) noexcept { apply(nullptr, _mapper.handle(end)); }

void SurfaceKeys::apply(const HostEvent *cause, const KeyChanges &changes) noexcept {
    _keyboard.apply(_surface, cause, changes);
    const bool wasHeld = std::exchange(_isHeld, _mapper.keyDown() != kNoKey);
    if (_onHeld && _isHeld && !wasHeld)
        _onHeld();
    _isIdle = _mapper.state() == KeyMapper::State::Idle || _mapper.state() == KeyMapper::State::Over;
}

} // namespace ZorvaTouch::Tools

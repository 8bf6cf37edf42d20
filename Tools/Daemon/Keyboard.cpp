#include "Tools/Daemon/Keyboard.h"

#include <exception>
#include <new>
#include <utility>

namespace ZorvaTouch::Tools {

Keyboard::Keyboard(KeyboardMaker maker, DaemonListener &listener, DaemonLog log)
    : _maker(std::move(maker)), _listener(listener), _log(std::move(log)) {
    plug();
}

Keyboard::~Keyboard() {
    for (const KeyChange release : _held.releaseAll())
        static_cast<void>(send(release));
}

void Keyboard::apply(const SurfaceName &surface, const HostEvent *cause, const KeyChanges &changes) noexcept {
    for (const KeyChange change : changes) {
        if ((_isAsleep && change.isPressed) || !_held.take(change))
            continue;
        const bool isSent = send(change);
        _listener.onKey(surface, cause, change, isSent);
    }
}

bool Keyboard::send(KeyChange change) noexcept {
    if (_output && trySend(change))
        return true;
    _output.reset();
    plug();
    // On a new keyboard every key is up.
    return _output && (!change.isPressed || trySend(change));
}

bool Keyboard::trySend(KeyChange change) noexcept {
    const auto failure = change.isPressed ? _output->press(change.code) : _output->release(change.code);
    if (failure)
        _log.error(change.isPressed ? "cannot press a key" : "cannot release a key", *failure);
    return !failure;
}

/// It is tried with every key, and told when there is something new.
void Keyboard::tellProblem(const char *problem) noexcept {
    try {
        if (_toldProblem == problem)
            return;
        _toldProblem = problem;
    } catch (const std::bad_alloc &) { // then it is told once more
    }
    _log.error({"keys are shown, not pressed: ", problem});
}

void Keyboard::plug() noexcept {
    if (_output || !_maker)
        return;
    try {
        _output = _maker();
        _toldProblem.clear();
    } catch (const std::exception &error) {
        tellProblem(error.what());
    }
}

} // namespace ZorvaTouch::Tools

#pragma once

#include <functional>
#include <memory>
#include <span>

namespace ZorvaTouch::Host {

/// Receives signals on a thread of its own, so that they are served also while the program's other threads
/// wait. Signals that the process was started to ignore stay ignored.
///
/// The signals are blocked on the calling thread, and on those that it starts from now on, until the
/// destructor restores what was blocked before. A program that must survive signals to its very end blocks
/// them beforehand with `blockForGood`.
///
/// Threads: made and destroyed by one thread; `onSignal` is called on this object's own.
class SignalWatch {
public:
    using Function = std::function<void(int signal)>;

    /// @param onSignal  Called for each signal, one at a time, and not after the destructor. Must not throw.
    /// @throws std::system_error
    SignalWatch(std::span<const int> signals, Function onSignal);
    ~SignalWatch();
    SignalWatch(const SignalWatch &) = delete;
    SignalWatch &operator=(const SignalWatch &) = delete;

private:
    class State;
    const std::unique_ptr<State> _state;
};

} // namespace ZorvaTouch::Host

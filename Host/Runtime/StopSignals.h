#pragma once

#include "Host/Runtime/SignalWatch.h"

#include <functional>

namespace ZorvaTouch::Host {

/// Hears the signals with which a user ends a program: SIGINT (Ctrl-C), SIGTERM and SIGHUP, without those
/// that the process was started to ignore. As long as this lives the first of them calls back instead of
/// ending the process; the second ends it as ever.
///
/// The signals are blocked on the calling thread and on those that it starts from now on: make this before
/// other threads.
///
/// Threads: `onStop` is called on a thread of this object's own.
class StopSignals {
public:
    /// @param onStop  Called once at most, and not after the destructor. Must not throw.
    /// @throws std::system_error
    explicit StopSignals(std::function<void()> onStop);

private:
    SignalWatch _watch;
};

} // namespace ZorvaTouch::Host

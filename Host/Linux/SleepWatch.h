#pragma once

#include "Host/Linux/MainLoop.h"
#include "Shared/Ports/Log.h"

#include <functional>
#include <memory>

namespace ZorvaTouch::Linux {

/// Tells when the machine is about to sleep, in time to do something about it: logind is asked to wait for
/// that, on the system bus.
///
/// What is missing or goes away costs one line in the log, and sleep is not told. A logind that comes later,
/// or again, is found at once; a bus by attempts to connect, with back-off.
///
/// Nothing here waits for the bus or for logind. Only logind itself is listened to, whoever else sends its
/// signals.
///
/// Threads: the main loop's.
class SleepWatch {
public:
    using Function = std::function<void()>;

    /// @param loop     Borrowed; outlives this.
    /// @param after    When to connect again; empty: the loop's own timer.
    /// @param onSleep  The machine sleeps once this has returned, or after five seconds (logind's
    ///                 InhibitDelayMaxSec). Called twice if logind says it twice.
    /// @param onWake   The machine is awake, or nobody will say any more when it is. Once after `onSleep`.
    ///                 What they throw ends the loop. They must not destroy this.
    /// @throws std::bad_alloc
    SleepWatch(MainLoop &loop, Ports::LogProvider &logs, Function onSleep, Function onWake,
               LoopTimer after = {});
    /// The machine need not wait any more.
    ~SleepWatch();
    SleepWatch(const SleepWatch &) = delete;
    SleepWatch &operator=(const SleepWatch &) = delete;

    /// Whether the machine waits for `onSleep` before it sleeps.
    [[nodiscard]] bool isHoldingSleep() const noexcept;

private:
    class Logind;
    const std::unique_ptr<Logind> _logind;
};

} // namespace ZorvaTouch::Linux

#pragma once

#include "Host/Interface/RunLoop.h"
#include "Shared/Ports/Clock.h"
#include "Shared/Ports/Log.h"

#include <cstdint>
#include <functional>
#include <memory>

namespace ZorvaTouch::Host {

/// A counting semaphore that begins at 0. It sleeps at once when it has to wait.
///
/// Threads: any.
class Semaphore {
public:
    virtual ~Semaphore() = default;
    virtual void signal() noexcept = 0;
    /// Waits without limit.
    virtual void wait() noexcept = 0;
};

/// A thread that was started. Destroying one that was not joined lets it run on by itself.
class Thread {
public:
    virtual ~Thread() = default;
    /// Waits until the thread has left its body. At most once, and not on the thread itself.
    virtual void join() noexcept = 0;
    /// Whether the caller is this thread.
    [[nodiscard]] virtual bool isCurrent() const noexcept = 0;
};

/// Points in the road of a report that tools outside of the process can watch.
namespace Trace {
inline constexpr std::uint32_t kInputReport = 0x2B150180; ///< the report's first four bytes, each an argument
inline constexpr std::uint32_t kDispatchLand = 0x2B150184;  ///< number of events
inline constexpr std::uint32_t kDispatchEvent = 0x2B150188; ///< type, phase
inline constexpr std::uint32_t kFirmwareEvent = 0x2B15018C; ///< event code, payload as a big-endian number
} // namespace Trace

/// Where trace points go.
class TraceSink {
public:
    virtual ~TraceSink() = default;
    /// Arguments that a point does not have are 0.
    ///
    /// Threads:  any.
    /// Realtime: yes; next to nothing when nobody watches.
    virtual void emit(std::uint32_t code, std::uint64_t argument0, std::uint64_t argument1 = 0,
                      std::uint64_t argument2 = 0, std::uint64_t argument3 = 0) noexcept = 0;
};

/// What a plug-in gets from the process it is loaded into, beside what its host hands it.
///
/// Threads: any.
class Platform {
public:
    virtual ~Platform() = default;

    [[nodiscard]] virtual Ports::LogProvider &logs() noexcept = 0;
    /// Host ticks. The clock lives as long as the platform.
    [[nodiscard]] virtual Ports::Clock &clock() noexcept = 0;
    [[nodiscard]] virtual TraceSink &trace() noexcept = 0;

    /// @throws std::system_error
    [[nodiscard]] virtual std::unique_ptr<Semaphore> createSemaphore() = 0;

    /// @param name  At most 15 characters, for those who list threads.
    /// @param body  Must not throw. No signal comes to it.
    /// @throws std::system_error  There is no thread to be had; `body` is destroyed unrun.
    [[nodiscard]] virtual std::unique_ptr<Thread> startThread(const char *name,
                                                              std::function<void()> body) = 0;

    /// A run loop for the calling thread.
    /// @throws std::system_error
    [[nodiscard]] virtual std::shared_ptr<RunLoop> createRunLoop() = 0;

    /// Gives the calling thread the round-robin real-time policy.
    /// @return 0 or the error's number.
    [[nodiscard]] virtual int setRoundRobinPriority(int priority) noexcept = 0;
};

/// The process's platform: the system's own unless the host put another in its place.
/// @throws std::bad_alloc  The system's own is made when it is first asked for.
[[nodiscard]] Platform &processPlatform();

/// Puts a platform in the place of the system's own; null brings that back. For hosts, before they load a
/// plug-in: who has taken the old one keeps it.
/// @param platform  Borrowed; outlives every service made after this.
void setProcessPlatform(Platform *platform) noexcept;

} // namespace ZorvaTouch::Host

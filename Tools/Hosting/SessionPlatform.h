#pragma once

#include "Host/Interface/Platform.h"

#include <atomic>
#include <latch>
#include <memory>
#include <mutex>

namespace ZorvaTouch::Tools {

/// The system's platform with another log and perhaps another clock; the process's own as long as it lives.
/// It knows when a run loop that it has made is at work.
class SessionPlatform final : public Host::Platform {
public:
    /// @param logs   For the plug-in.
    /// @param clock  Borrowed; null: the system's.
    SessionPlatform(std::shared_ptr<Ports::LogProvider> logs, Ports::Clock *clock);
    ~SessionPlatform() override;
    SessionPlatform(const SessionPlatform &) = delete;
    SessionPlatform &operator=(const SessionPlatform &) = delete;

    [[nodiscard]] Ports::LogProvider &logs() noexcept override { return *_logs; }
    [[nodiscard]] Ports::Clock &clock() noexcept override { return _clock; }
    [[nodiscard]] Host::TraceSink &trace() noexcept override { return _system.trace(); }
    [[nodiscard]] std::unique_ptr<Host::Semaphore> createSemaphore() override;
    [[nodiscard]] std::unique_ptr<Host::Thread> startThread(const char *name,
                                                            std::function<void()> body) override;
    [[nodiscard]] std::shared_ptr<Host::RunLoop> createRunLoop() override;
    [[nodiscard]] int setRoundRobinPriority(int priority) noexcept override;

    /// From now on threads that ask for real time get none and are not told: it has been found out, and said,
    /// that the system grants none.
    void forgoRealTime() noexcept { _hasRealTime = false; }

    /// Waits until the last run loop has begun to serve, that is until its thread has scheduled all that it
    /// was going to; or until the loop is gone. Returns at once if there is none.
    void waitUntilServing();

private:
    class WatchedRunLoop;

    const std::shared_ptr<Ports::LogProvider> _logs;
    Host::Platform &_system;
    Ports::Clock &_clock;
    std::atomic<bool> _hasRealTime{true};
    std::mutex _lock;
    std::shared_ptr<std::latch> _isServing; ///< of the last run loop; under the lock
};

} // namespace ZorvaTouch::Tools

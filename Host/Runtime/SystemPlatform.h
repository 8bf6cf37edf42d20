#pragma once

#include "Host/Interface/Platform.h"
#include "Host/Runtime/ProbeTraceSink.h"
#include "Host/Runtime/SpdlogLogs.h"
#include "Host/Runtime/SteadyClock.h"

#include <cstdio>

namespace ZorvaTouch::Host {

/// The environment variable that says what is logged: `debug`, `default` or `error`.
inline constexpr const char *kLogLevelVariable = "ZORVATOUCH_LOG";

/// The platform of a real machine.
class SystemPlatform final : public Platform {
public:
    /// @param logLevel  The variable's value; null or empty is `error`, and so is what is none of the three,
    ///                  after a line in the log.
    /// @param stream    Where the log goes. Borrowed; outlives the platform and the log's handles.
    explicit SystemPlatform(const char *logLevel, std::FILE *stream = stderr);

    [[nodiscard]] Ports::LogProvider &logs() noexcept override { return _logs; }
    [[nodiscard]] Ports::Clock &clock() noexcept override { return _clock; }
    [[nodiscard]] TraceSink &trace() noexcept override { return _trace; }
    [[nodiscard]] std::unique_ptr<Semaphore> createSemaphore() override;
    [[nodiscard]] std::unique_ptr<Thread> startThread(const char *name, std::function<void()> body) override;
    [[nodiscard]] std::shared_ptr<RunLoop> createRunLoop() override;
    [[nodiscard]] int setRoundRobinPriority(int priority) noexcept override;

private:
    SpdlogLogs _logs;
    SteadyClock _clock;
    ProbeTraceSink _trace;
};

} // namespace ZorvaTouch::Host

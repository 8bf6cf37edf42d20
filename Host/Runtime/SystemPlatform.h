#pragma once

#include "Host/Interface/Platform.h"
#include "Host/Runtime/ProbeTraceSink.h"
#include "Host/Runtime/SteadyClock.h"

#include <cstdio>
#include <memory>

namespace ZorvaTouch::Host {

/// The environment variable that says what is logged: `debug`, `default` or `error`.
inline constexpr const char *kLogLevelVariable = "ZORVATOUCH_LOG";

/// The platform of a real machine.
class SystemPlatform final : public Platform {
public:
    /// Logs to standard error by way of a thread (`AsyncLogs`), which starts when the first handle is opened.
    /// @param logLevel  The variable's value; null or empty is `error`, and so is what is none of the three,
    ///                  after a line in the log.
    explicit SystemPlatform(const char *logLevel);
    /// Logs to a stream, and waits for it.
    /// @param stream  Borrowed; outlives the platform and the log's handles.
    SystemPlatform(const char *logLevel, std::FILE *stream);
    ~SystemPlatform() override;
    SystemPlatform(const SystemPlatform &) = delete;
    SystemPlatform &operator=(const SystemPlatform &) = delete;

    [[nodiscard]] Ports::LogProvider &logs() noexcept override { return *_logs; }
    [[nodiscard]] Ports::Clock &clock() noexcept override { return _clock; }
    [[nodiscard]] TraceSink &trace() noexcept override { return _trace; }
    [[nodiscard]] std::unique_ptr<Semaphore> createSemaphore() override;
    [[nodiscard]] std::unique_ptr<Thread> startThread(const char *name, std::function<void()> body) override;
    [[nodiscard]] std::shared_ptr<RunLoop> createRunLoop() override;
    [[nodiscard]] int setRoundRobinPriority(int priority) noexcept override;

private:
    SystemPlatform(const char *logLevel, std::unique_ptr<Ports::LogProvider> logs);

    const std::unique_ptr<Ports::LogProvider> _logs;
    SteadyClock _clock;
    ProbeTraceSink _trace;
};

} // namespace ZorvaTouch::Host

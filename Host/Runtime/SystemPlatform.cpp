#include "Host/Runtime/SystemPlatform.h"

#include "Host/Runtime/AsioRunLoop.h"
#include "Host/Runtime/AsyncLogs.h"
#include "Host/Runtime/SpdlogLogs.h"
#include "Host/Runtime/SystemSemaphore.h"
#include "Host/Runtime/SystemThread.h"
#include "Shared/LogNames.h"

#include <atomic>
#include <cstddef>
#include <cstdlib>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

constexpr std::size_t kLongestWord = 40; ///< of the variable, in a message

std::optional<Ports::LogLevel> logLevelNamed(std::string_view name) {
    if (name == "debug")
        return Ports::LogLevel::Debug;
    if (name == "default")
        return Ports::LogLevel::Default;
    if (name == "error" || name.empty())
        return Ports::LogLevel::Error;
    return std::nullopt;
}

/// @param logLevel  May be null.
Ports::LogLevel levelOf(const char *logLevel) {
    return logLevelNamed(logLevel ? logLevel : "").value_or(Ports::LogLevel::Error);
}

/// `AsyncLogs` to standard error, made with the first handle: a process that has a platform of its own has no
/// thread for this one.
class StandardErrorLogs final : public Ports::LogProvider {
public:
    explicit StandardErrorLogs(Ports::LogLevel minimum) : _minimum(minimum) {}

    /// @throws std::system_error, std::bad_alloc
    std::shared_ptr<Ports::Log> openLog(std::string_view subsystem, std::string_view category) override {
        std::call_once(_once, [this] {
            _logs.emplace(_minimum, logLine, std::make_shared<StreamWriter>(StandardStream::Error));
        });
        return _logs->openLog(subsystem, category);
    }

private:
    const Ports::LogLevel _minimum;
    std::once_flag _once;
    std::optional<AsyncLogs> _logs;
};

std::atomic<Platform *> platformOfTheHost{nullptr};

} // namespace

SystemPlatform::SystemPlatform(const char *logLevel, std::unique_ptr<Ports::LogProvider> logs)
    : _logs(std::move(logs)) {
    if (logLevel && !logLevelNamed(logLevel))
        _logs->openLog(kLogSubsystem, "Platform")
            ->write(Ports::LogLevel::Error, std::string(kLogLevelVariable)
                                                .append(" must be debug, default or error, not ")
                                                .append(std::string_view(logLevel).substr(0, kLongestWord)));
}

SystemPlatform::SystemPlatform(const char *logLevel)
    : SystemPlatform(logLevel, std::make_unique<StandardErrorLogs>(levelOf(logLevel))) {}

SystemPlatform::SystemPlatform(const char *logLevel, std::FILE *stream)
    : SystemPlatform(logLevel, std::make_unique<SpdlogLogs>(levelOf(logLevel), stream)) {}

SystemPlatform::~SystemPlatform() = default;

std::unique_ptr<Semaphore> SystemPlatform::createSemaphore() { return std::make_unique<SystemSemaphore>(); }

std::unique_ptr<Thread> SystemPlatform::startThread(const char *name, std::function<void()> body) {
    return startSystemThread(name, std::move(body));
}

std::shared_ptr<RunLoop> SystemPlatform::createRunLoop() {
    return AsioRunLoop::create(processPlatform().logs().openLog(kLogSubsystem, "RunLoop"));
}

int SystemPlatform::setRoundRobinPriority(int priority) noexcept {
    return setRoundRobinPriorityOfThisThread(priority);
}

Platform &processPlatform() {
    if (Platform *const platform = platformOfTheHost.load(std::memory_order_acquire))
        return *platform;
    // Made when it is first asked for; gone when the library is unloaded or the process ends.
    static SystemPlatform system(std::getenv(kLogLevelVariable));
    return system;
}

void setProcessPlatform(Platform *platform) noexcept {
    platformOfTheHost.store(platform, std::memory_order_release);
}

} // namespace ZorvaTouch::Host

#include "Host/Runtime/SystemPlatform.h"

#include "Host/Runtime/AsioRunLoop.h"
#include "Host/Runtime/SystemSemaphore.h"
#include "Host/Runtime/SystemThread.h"
#include "Shared/LogNames.h"

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

std::optional<Ports::LogLevel> logLevelNamed(std::string_view name) {
    if (name == "debug")
        return Ports::LogLevel::Debug;
    if (name == "default")
        return Ports::LogLevel::Default;
    if (name == "error" || name.empty())
        return Ports::LogLevel::Error;
    return std::nullopt;
}

std::string_view textOf(const char *logLevel) { return logLevel ? logLevel : ""; }

/// As much of a text as fits a line.
std::string excerpt(std::string_view text) {
    std::string result(text.substr(0, 40));
    std::ranges::replace_if(
        result, [](char c) { return c < ' ' || c > '~'; }, '?');
    return result;
}

std::atomic<Platform *> platformOfTheHost{nullptr};

} // namespace

SystemPlatform::SystemPlatform(const char *logLevel, std::FILE *stream)
    : _logs(logLevelNamed(textOf(logLevel)).value_or(Ports::LogLevel::Error), stream) {
    if (!logLevelNamed(textOf(logLevel)))
        _logs.openLog(kLogSubsystem, "Platform")
            ->write(Ports::LogLevel::Error,
                    std::string(kLogLevelVariable) + " is debug, default or error, not " + excerpt(logLevel));
}

std::unique_ptr<Semaphore> SystemPlatform::createSemaphore() { return std::make_unique<SystemSemaphore>(); }

std::unique_ptr<Thread> SystemPlatform::startThread(const char *name, std::function<void()> body) {
    return startSystemThread(name, std::move(body));
}

std::shared_ptr<RunLoop> SystemPlatform::createRunLoop() {
    return AsioRunLoop::create(_logs.openLog(kLogSubsystem, "RunLoop"));
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

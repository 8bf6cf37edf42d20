#pragma once

#include "Host/Interface/Platform.h"

namespace ZorvaTouch::Bench {

/// The process's platform without a log, and without real-time priorities unless they are wanted.
class BenchPlatform final : public Host::Platform {
public:
    explicit BenchPlatform(bool realTime) : _realTime(realTime) {}

    Ports::LogProvider &logs() noexcept override { return Ports::silentLogProvider(); }
    Ports::Clock &clock() noexcept override { return _system.clock(); }
    Host::TraceSink &trace() noexcept override { return _system.trace(); }
    std::unique_ptr<Host::Semaphore> createSemaphore() override { return _system.createSemaphore(); }
    std::unique_ptr<Host::Thread> startThread(const char *name, std::function<void()> body) override {
        return _system.startThread(name, std::move(body));
    }
    std::shared_ptr<Host::RunLoop> createRunLoop() override { return _system.createRunLoop(); }
    int setRoundRobinPriority(int priority) noexcept override {
        return _realTime ? _system.setRoundRobinPriority(priority) : 0;
    }

private:
    Host::Platform &_system = Host::processPlatform();
    const bool _realTime;
};

} // namespace ZorvaTouch::Bench

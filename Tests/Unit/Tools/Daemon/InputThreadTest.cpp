#include "Tests/Unit/Tools/Daemon/SurfacesFixture.h"

#include <gmock/gmock.h>

#include <functional>
#include <memory>
#include <stdexcept>

namespace ZorvaTouch::Tools {
namespace {

using testing::HasSubstr;
using testing::SizeIs;

/// A system that has no more threads, or no more run loops, to give.
class ShortPlatform final : public Host::Platform {
public:
    /// @param failures  Counts what could not be had.
    ShortPlatform(Host::Platform &system, unsigned &failures) : _system(system), _failures(failures) {}

    Ports::LogProvider &logs() noexcept override { return _system.logs(); }
    Ports::Clock &clock() noexcept override { return _system.clock(); }
    Host::TraceSink &trace() noexcept override { return _system.trace(); }
    std::unique_ptr<Host::Semaphore> createSemaphore() override { return _system.createSemaphore(); }
    std::unique_ptr<Host::Thread> startThread(const char *name, std::function<void()> body) override {
        if (hasThreads)
            return _system.startThread(name, std::move(body));
        ++_failures;
        throw std::runtime_error("no thread");
    }
    std::shared_ptr<Host::RunLoop> createRunLoop() override {
        if (hasLoops)
            return _system.createRunLoop();
        ++_failures;
        throw std::runtime_error("Too many open files");
    }
    int setRoundRobinPriority(int priority) noexcept override {
        return _system.setRoundRobinPriority(priority);
    }

    bool hasThreads = true, hasLoops = true;

private:
    Host::Platform &_system;
    unsigned &_failures;
};

class InputThreads : public Tests::SurfacesFixture {
protected:
    InputThreads() { Host::setProcessPlatform(&system); }
    ~InputThreads() override {
        surfaces.reset();
        Host::setProcessPlatform(&platform);
    }
    void add() {
        surfaces->onAdded(identity(1, "SN1"));
        settle();
    }

    ShortPlatform system{platform, threadFailures};
};

TEST_F(InputThreads, ThatCannotBeHadAreAFailureOfTheSurfaceWhichIsTriedAgain) {
    for (bool ShortPlatform::*const has : {&ShortPlatform::hasThreads, &ShortPlatform::hasLoops}) {
        surfaces->closeAll();
        system.*has = false;
        add();
        EXPECT_THAT(told.surfaces.lines().back(), HasSubstr("failed"));
        EXPECT_THAT(timers.pending(), SizeIs(1));
        system.*has = true;
        fireFirst();
        EXPECT_THAT(told.surfaces.lines().back(), HasSubstr("opened"));
    }
}

} // namespace
} // namespace ZorvaTouch::Tools

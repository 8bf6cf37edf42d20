#include "Tests/Unit/Tools/Daemon/SurfacesFixture.h"

#include <gmock/gmock.h>

#include <array>
#include <functional>
#include <memory>
#include <stdexcept>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

using testing::AllOf;
using testing::HasSubstr;
using testing::SizeIs;

/// A system that has no more threads, or no more run loops, to give.
class ShortPlatform final : public Host::Platform {
public:
    explicit ShortPlatform(Host::Platform &system) : _system(system) {}

    Ports::LogProvider &logs() noexcept override { return _system.logs(); }
    Ports::Clock &clock() noexcept override { return _system.clock(); }
    Host::TraceSink &trace() noexcept override { return _system.trace(); }
    std::unique_ptr<Host::Semaphore> createSemaphore() override { return _system.createSemaphore(); }
    std::unique_ptr<Host::Thread> startThread(const char *name, std::function<void()> body) override {
        if (hasThreads)
            return _system.startThread(name, std::move(body));
        throw std::runtime_error("no thread");
    }
    std::shared_ptr<Host::RunLoop> createRunLoop() override {
        if (hasLoops)
            return _system.createRunLoop();
        throw std::runtime_error("Too many open files");
    }
    int setRoundRobinPriority(int priority) noexcept override {
        return _system.setRoundRobinPriority(priority);
    }

    bool hasThreads = true, hasLoops = true;

private:
    Host::Platform &_system;
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

    ShortPlatform system{platform};
};

TEST_F(InputThreads, ThatCannotBeHadAreAFailureOfTheSurfaceWhichIsTriedAgain) {
    const std::array<std::pair<bool ShortPlatform::*, const char *>, 2> shortages{
        {{&ShortPlatform::hasThreads, "cannot read reports: no thread"},
         {&ShortPlatform::hasLoops, "cannot read reports: Too many open files"}}};
    for (const auto &[has, reason] : shortages) {
        surfaces->closeAll();
        system.*has = false;
        add();
        EXPECT_THAT(told.surfaces.lines().back(), AllOf(HasSubstr("failed"), HasSubstr(reason)));
        EXPECT_THAT(timers.pending(), SizeIs(1));
        system.*has = true;
        fireFirst();
        EXPECT_THAT(told.surfaces.lines().back(), HasSubstr("opened"));
    }
}

} // namespace
} // namespace ZorvaTouch::Tools

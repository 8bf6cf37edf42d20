#pragma once

#include "Tests/Unit/Host/Runtime/RuntimeSupport.h"

#include <gtest/gtest.h>

#include <list>

namespace ZorvaTouch::Host::RuntimeTests {

/// A run loop of the system's platform, and sources that write down who was served.
class RunLoopFixture : public ::testing::Test {
protected:
    RunLoopFixture() {
        setProcessPlatform(&platform); // whose log the loop gets
        loop = platform.createRunLoop();
        boundary = loop->boundary();
    }
    ~RunLoopFixture() override { setProcessPlatform(nullptr); }

    /// A signalled source; `action` is what it does beside leaving its name in `served`.
    std::uint64_t addSource(char name, std::function<void()> action = {}, const char *mode = "mode") {
        return boundary->table->addSource(boundary, mode, &Callable::call, callable(name, action));
    }
    std::uint64_t addDescriptor(char name, int descriptor, std::function<void()> action = {},
                                const char *mode = "mode") {
        return boundary->table->addDescriptor(boundary, mode, descriptor, &Callable::call,
                                              callable(name, action));
    }
    void signal(std::uint64_t source) { boundary->table->signalSource(boundary, source); }
    void remove(std::uint64_t source) { boundary->table->removeSource(boundary, source); }

    RunOutcome pass(const char *mode = "mode") { return loop->runOneSource(mode); }
    /// Runs that many passes.
    void passes(int count) {
        for (; count != 0; --count)
            ASSERT_EQ(pass(), RunOutcome::HandledSource);
    }

    LogText log;
    SystemPlatform platform{"debug", log.file()};
    std::string served;
    std::shared_ptr<RunLoop> loop;
    ZorvaRunLoop *boundary = nullptr;

private:
    void *callable(char name, const std::function<void()> &action) {
        return &_callables.emplace_back([this, name, action] {
            served.push_back(name);
            if (action)
                action();
        });
    }

    std::list<Callable> _callables;
};

} // namespace ZorvaTouch::Host::RuntimeTests

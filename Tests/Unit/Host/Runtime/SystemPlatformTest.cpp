#include "Host/Runtime/SystemPlatform.h"

#include "Tests/Unit/Host/Runtime/RuntimeSupport.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <csignal>
#include <memory>
#include <pthread.h>
#include <string>
#include <system_error>
#include <thread>

namespace ZorvaTouch::Host {
namespace {

using Ports::LogLevel;
using RuntimeTests::LogText;

// --- Logs ------------------------------------------------------------------------------------------

/// The levels that a platform made with this value of the variable logs: D, d and e.
std::string enabledLevels(const char *logLevel, const LogText &log) {
    SystemPlatform platform(logLevel, log.file());
    const auto handle = platform.logs().openLog("s", "c");
    std::string levels;
    if (handle->isEnabled(LogLevel::Debug))
        levels.push_back('D');
    if (handle->isEnabled(LogLevel::Default))
        levels.push_back('d');
    if (handle->isEnabled(LogLevel::Error))
        levels.push_back('e');
    return levels;
}

TEST(SystemPlatform, LogsFromTheLevelThatTheVariableNames) {
    const LogText log;
    EXPECT_EQ(enabledLevels("debug", log), "Dde");
    EXPECT_EQ(enabledLevels("default", log), "de");
    EXPECT_EQ(enabledLevels("error", log), "e");
    EXPECT_EQ(enabledLevels("", log), "e");
    EXPECT_EQ(enabledLevels(nullptr, log), "e");
    EXPECT_EQ(log.text(), "");
}

TEST(SystemPlatform, SaysInOneLineThatItDoesNotKnowALevel) {
    const LogText log;
    EXPECT_EQ(enabledLevels("Debug\n\x1b[31m", log), "e");
    EXPECT_EQ(log.text(), "error subsystem=org.zorva.hid.ZorvaTouch category=Platform "
                          "ZORVATOUCH_LOG must be debug, default or error, not Debug\\n\\x1b[31m\n");
}

// --- Clock and trace points ------------------------------------------------------------------------

TEST(SystemPlatform, TicksAreNanosecondsAndGoOn) {
    SystemPlatform platform("error");
    EXPECT_EQ(platform.clock().timeBase().numer, 1u);
    EXPECT_EQ(platform.clock().timeBase().denom, 1u);
    const std::uint64_t before = platform.clock().nowTicks();
    EXPECT_GE(platform.clock().nowTicks(), before);
}

TEST(SystemPlatform, TracePointsThatNobodyWatchesDoNothing) {
    SystemPlatform platform("error");
    for (const std::uint32_t code : {Trace::kInputReport, Trace::kDispatchLand, Trace::kDispatchEvent,
                                     Trace::kFirmwareEvent, 0u, 0x2B150190u})
        platform.trace().emit(code, 1, 2, 3, 4);
}

// --- Semaphores ------------------------------------------------------------------------------------

TEST(SystemThread, GetsNoSignals) {
    SystemPlatform platform("error");
    ::sigset_t blocked;
    ::sigemptyset(&blocked);
    platform.startThread("test", [&] { ::pthread_sigmask(SIG_SETMASK, nullptr, &blocked); })->join();
    for (const int signal : {SIGTERM, SIGINT, SIGHUP, SIGUSR1})
        EXPECT_EQ(::sigismember(&blocked, signal), 1) << signal;
    ::sigset_t own;
    ::pthread_sigmask(SIG_SETMASK, nullptr, &own);
    EXPECT_EQ(::sigismember(&own, SIGTERM), 0) << "the starter's are as before";
}

TEST(SystemSemaphore, CountsSignals) {
    SystemPlatform platform("error");
    const auto semaphore = platform.createSemaphore();
    semaphore->signal();
    semaphore->signal();
    semaphore->wait();
    semaphore->wait();
}

std::atomic<int> interruptions{0};

TEST(SystemSemaphore, GoesOnWaitingWhenTheThreadIsInterrupted) {
    SystemPlatform platform("error");
    const auto hasBegun = platform.createSemaphore();
    const auto isDone = platform.createSemaphore();
    struct sigaction action {};
    action.sa_handler = [](int) { ++interruptions; };
    struct sigaction before {};
    ASSERT_EQ(::sigaction(SIGUSR1, &action, &before), 0);

    ::pthread_t waiting{};
    std::atomic<bool> hasWaited = false;
    const auto thread = platform.startThread("test", [&] {
        ::sigset_t signals; // which such a thread does not get of its own accord
        ::sigemptyset(&signals);
        ::sigaddset(&signals, SIGUSR1);
        ::pthread_sigmask(SIG_UNBLOCK, &signals, nullptr);
        waiting = ::pthread_self();
        hasBegun->signal();
        isDone->wait();
        hasWaited = true;
    });
    hasBegun->wait();
    while (interruptions < 10 && !hasWaited) {
        ASSERT_EQ(::pthread_kill(waiting, SIGUSR1), 0);
        std::this_thread::yield();
    }
    EXPECT_FALSE(hasWaited);
    isDone->signal();
    thread->join();
    EXPECT_TRUE(hasWaited);
    ::sigaction(SIGUSR1, &before, nullptr);
}

// --- Threads ---------------------------------------------------------------------------------------

std::string nameOfThisThread() {
    char name[16] = {};
    ::pthread_getname_np(::pthread_self(), name, sizeof(name));
    return name;
}

TEST(SystemThread, HasItsNameCutOffAfter15Characters) {
    SystemPlatform platform("error");
    std::string name;
    platform.startThread("input thread", [&] { name = nameOfThisThread(); })->join();
    EXPECT_EQ(name, "input thread");
    platform.startThread("0123456789abcdefgh", [&] { name = nameOfThisThread(); })->join();
    EXPECT_EQ(name, "0123456789abcde");
}

TEST(SystemThread, KnowsWhetherItIsTheCaller) {
    SystemPlatform platform("error");
    const auto isStarted = platform.createSemaphore();
    std::unique_ptr<Thread> thread;
    bool isCurrent = false;
    thread = platform.startThread("test", [&] {
        isStarted->wait();
        isCurrent = thread->isCurrent();
    });
    EXPECT_FALSE(thread->isCurrent());
    isStarted->signal();
    thread->join();
    EXPECT_TRUE(isCurrent);
    EXPECT_FALSE(thread->isCurrent());
}

TEST(SystemThread, HasDestroyedItsBodyWhenItIsJoined) {
    SystemPlatform platform("error");
    const auto witness = std::make_shared<int>(0);
    const auto thread = platform.startThread("test", [witness] {});
    thread->join();
    EXPECT_EQ(witness.use_count(), 1);
}

TEST(SystemThread, RunsOnWhenItIsDestroyedUnjoined) {
    SystemPlatform platform("error");
    const auto mayEnd = platform.createSemaphore();
    const std::shared_ptr<Semaphore> hasEnded = platform.createSemaphore();
    auto thread = platform.startThread("test", [&mayEnd, hasEnded] {
        mayEnd->wait();
        hasEnded->signal();
    });
    thread.reset();
    mayEnd->signal();
    hasEnded->wait();
}

/// New threads get a stack that no machine has.
class HugeStacks {
public:
    HugeStacks() {
        ::pthread_getattr_default_np(&_before);
        pthread_attr_t huge;
        ::pthread_attr_init(&huge);
        EXPECT_EQ(::pthread_attr_setstacksize(&huge, std::size_t{1} << 50), 0);
        EXPECT_EQ(::pthread_setattr_default_np(&huge), 0);
        ::pthread_attr_destroy(&huge);
    }
    ~HugeStacks() {
        ::pthread_setattr_default_np(&_before);
        ::pthread_attr_destroy(&_before);
    }
    HugeStacks(const HugeStacks &) = delete;
    HugeStacks &operator=(const HugeStacks &) = delete;

private:
    pthread_attr_t _before{};
};

TEST(SystemThread, ThatCannotBeHadIsToldAndItsBodyDestroyedUnrun) {
    SystemPlatform platform("error");
    const auto witness = std::make_shared<int>(0);
    {
        const HugeStacks nowhere;
        EXPECT_THROW((void)platform.startThread("test", [witness] { *witness = 1; }), std::system_error);
    }
    EXPECT_EQ(witness.use_count(), 1);
    EXPECT_EQ(*witness, 0);
}

TEST(SystemPlatform, APriorityOutOfRangeIsAnErrorsNumber) {
    SystemPlatform platform("error");
    EXPECT_EQ(platform.setRoundRobinPriority(1000), EINVAL);
}

// --- The process's platform ------------------------------------------------------------------------

TEST(ProcessPlatform, IsTheHostsAsLongAsItGaveOne) {
    Platform &system = processPlatform();
    EXPECT_EQ(&processPlatform(), &system);
    SystemPlatform other("error");
    setProcessPlatform(&other);
    EXPECT_EQ(&processPlatform(), &other);
    setProcessPlatform(nullptr);
    EXPECT_EQ(&processPlatform(), &system);
}

} // namespace
} // namespace ZorvaTouch::Host

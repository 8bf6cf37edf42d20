#include "Host/Runtime/StopSignals.h"

#include <gtest/gtest.h>

#include <signal.h>
#include <unistd.h>

#include <array>
#include <atomic>
#include <semaphore>

namespace ZorvaTouch::Host {
namespace {

bool isBlocked(int signal) {
    sigset_t blocked;
    ::pthread_sigmask(SIG_BLOCK, nullptr, &blocked);
    return ::sigismember(&blocked, signal) == 1;
}

TEST(StopSignals, TheFirstCallsBackAndTheProcessGoesOn) {
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
        std::binary_semaphore stopped(0);
        const StopSignals signals([&] { stopped.release(); });
        ASSERT_EQ(::kill(::getpid(), signal), 0);
        stopped.acquire();
    }
}

TEST(StopSignals, NothingIsCalledWithoutASignal) {
    std::atomic<int> calls = 0;
    {
        const StopSignals signals([&] { ++calls; });
    }
    EXPECT_EQ(calls, 0);
}

TEST(StopSignals, BringsBackWhatWasBlockedBefore) {
    ASSERT_FALSE(isBlocked(SIGINT));
    {
        const StopSignals signals([] {});
        EXPECT_TRUE(isBlocked(SIGINT));
        EXPECT_TRUE(isBlocked(SIGTERM));
        EXPECT_TRUE(isBlocked(SIGHUP));
    }
    EXPECT_FALSE(isBlocked(SIGINT));
    EXPECT_FALSE(isBlocked(SIGTERM));
    EXPECT_FALSE(isBlocked(SIGHUP));
}

TEST(StopSignals, LeavesAloneWhatTheProcessIgnores) {
    const auto before = ::signal(SIGHUP, SIG_IGN);
    {
        const StopSignals signals([] {});
        EXPECT_FALSE(isBlocked(SIGHUP));
        EXPECT_TRUE(isBlocked(SIGTERM));
    }
    ::signal(SIGHUP, before);
}

TEST(StopSignalsDeathTest, TheSecondEndsTheProcessAsEver) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(
        {
            std::binary_semaphore stopped(0);
            const StopSignals signals([&] { stopped.release(); });
            ::kill(::getpid(), SIGTERM);
            stopped.acquire();
            ::kill(::getpid(), SIGTERM);
            for (;;)
                ::pause();
        },
        ::testing::KilledBySignal(SIGTERM), "");
}

} // namespace
} // namespace ZorvaTouch::Host

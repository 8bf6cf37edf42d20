#include "Host/Simulated/VirtualClock.h"

#include <gtest/gtest.h>

#include <limits>
#include <thread>

namespace ZorvaTouch::Simulated {
namespace {

constexpr std::uint64_t kEnd = std::numeric_limits<std::uint64_t>::max();

TEST(VirtualClock, StandsStillUntilItIsAdvanced) {
    VirtualClock clock(100);
    EXPECT_EQ(clock.nowTicks(), 100u);
    EXPECT_EQ(clock.nowTicks(), 100u);
    clock.advanceTicks(5);
    EXPECT_EQ(clock.nowTicks(), 105u);
}

TEST(VirtualClock, ATickIsANanosecondUnlessItIsTold) {
    VirtualClock clock;
    EXPECT_EQ(clock.timeBase().numer, 1u);
    EXPECT_EQ(clock.timeBase().denom, 1u);
    clock.sleepMicroseconds(7);
    EXPECT_EQ(clock.nowTicks(), 7000u);
}

TEST(VirtualClock, CountsInItsTimeBase) {
    VirtualClock clock(0, {125, 3});
    EXPECT_EQ(clock.timeBase().numer, 125u);
    EXPECT_EQ(clock.timeBase().denom, 3u);
    clock.sleepMicroseconds(1000); // 24 MHz
    EXPECT_EQ(clock.nowTicks(), 24000u);
    clock.advanceToNanoseconds(2'000'000);
    EXPECT_EQ(clock.nowTicks(), 48000u);
}

TEST(VirtualClock, NeverGoesBack) {
    VirtualClock clock(1000);
    clock.advanceToTicks(999);
    EXPECT_EQ(clock.nowTicks(), 1000u);
    clock.advanceToNanoseconds(0);
    EXPECT_EQ(clock.nowTicks(), 1000u);
    clock.advanceToTicks(1001);
    EXPECT_EQ(clock.nowTicks(), 1001u);
}

TEST(VirtualClock, StaysAtItsEnd) {
    VirtualClock clock(1000);
    clock.sleepMicroseconds(kEnd);
    EXPECT_EQ(clock.nowTicks(), kEnd);
    clock.advanceTicks(1);
    EXPECT_EQ(clock.nowTicks(), kEnd);
    VirtualClock other(1, {125, 3});
    other.sleepMicroseconds(kEnd / 2);
    EXPECT_EQ(other.nowTicks(), kEnd);
}

TEST(VirtualClock, ToleratesATimeBaseOfZeros) {
    VirtualClock clock(3, {0, 0});
    clock.sleepMicroseconds(1000);
    EXPECT_EQ(clock.nowTicks(), 3u);
}

TEST(VirtualClock, LosesNoTimeWhenSeveralThreadsAdvanceIt) {
    VirtualClock clock;
    const auto advance = [&] {
        for (int i = 0; i < 10000; ++i)
            clock.sleepMicroseconds(1);
    };
    std::thread other(advance);
    advance();
    other.join();
    EXPECT_EQ(clock.nowTicks(), 20'000'000u);
}

} // namespace
} // namespace ZorvaTouch::Simulated

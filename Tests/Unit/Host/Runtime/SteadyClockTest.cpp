#include "Host/Runtime/SteadyClock.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Host {
namespace {

TEST(SteadyClock, ATickIsANanosecond) {
    SteadyClock clock;
    EXPECT_EQ(clock.timeBase().numer, 1u);
    EXPECT_EQ(clock.timeBase().denom, 1u);
}

TEST(SteadyClock, NeverGoesBack) {
    SteadyClock clock;
    std::uint64_t last = clock.nowTicks();
    for (int i = 0; i < 1000; ++i) {
        const std::uint64_t now = clock.nowTicks();
        ASSERT_GE(now, last);
        last = now;
    }
}

TEST(SteadyClock, SleepsAtLeastAsLongAsAsked) {
    // The one test that takes real time, a millisecond: what it tests is the real clock.
    SteadyClock clock;
    const std::uint64_t before = clock.nowTicks();
    clock.sleepMicroseconds(1000);
    EXPECT_GE(clock.nowTicks() - before, 1'000'000u);
    clock.sleepMicroseconds(0);
}

} // namespace
} // namespace ZorvaTouch::Host

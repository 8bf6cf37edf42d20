#include "Plugin/ReferenceCount.h"

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <thread>

namespace ZorvaTouch {
namespace {

TEST(ReferenceCount, BeginsAtOneAndTellsWhatIsLeft) {
    ReferenceCount count;
    EXPECT_EQ(count.retain(), 2u);
    EXPECT_EQ(count.retain(), 3u);
    EXPECT_EQ(count.release(), 2u);
    EXPECT_EQ(count.release(), 1u);
    EXPECT_EQ(count.release(), 0u);
}

TEST(ReferenceCount, GivesZeroToOneOfManyThreads) {
    constexpr int kRounds = 20'000;
    ReferenceCount count;
    std::atomic<int> zeros = 0;
    const auto use = [&] {
        for (int round = 0; round < kRounds; ++round) {
            count.retain();
            zeros += count.release() == 0;
        }
        zeros += count.release() == 0;
    };
    count.retain(); // one for each of the four
    count.retain();
    count.retain();
    {
        std::array<std::jthread, 4> threads;
        for (std::jthread &thread : threads)
            thread = std::jthread(use);
    }
    EXPECT_EQ(zeros, 1);
}

} // namespace
} // namespace ZorvaTouch

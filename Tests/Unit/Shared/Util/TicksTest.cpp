#include "Shared/Util/Ticks.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

using Ports::TimeBase;
using Util::TickConverter;

class MockClock : public Ports::Clock {
public:
    MOCK_METHOD(std::uint64_t, nowTicks, (), (noexcept, override));
    MOCK_METHOD(TimeBase, timeBase, (), (noexcept, override));
    MOCK_METHOD(void, sleepMicroseconds, (std::uint64_t durationUs), (noexcept, override));
};

constexpr TickConverter kConverter(TimeBase{.numer = 125, .denom = 3});

TEST(Ticks, ConvertsWithTheTimeBase) {
    EXPECT_EQ(kConverter.nanosecondsFromMachTime(24), 1000u); // 24 * 125 / 3
    EXPECT_EQ(kConverter.machTimeFromNanoseconds(1000), 24u); // 1000 * 3 / 125
    EXPECT_EQ(kConverter.nanosecondsFromMachTime(0), 0u);
    EXPECT_EQ(kConverter.machTimeFromNanoseconds(0), 0u);
}

TEST(Ticks, MultipliesBeforeItDividesAndTruncates) {
    EXPECT_EQ(kConverter.nanosecondsFromMachTime(1), 41u);  // 125 / 3 = 41.67
    EXPECT_EQ(kConverter.nanosecondsFromMachTime(2), 83u);  // 250 / 3 = 83.33
    EXPECT_EQ(kConverter.machTimeFromNanoseconds(100), 2u); // 300 / 125 = 2.4
    EXPECT_EQ(kConverter.machTimeFromNanoseconds(41), 0u);  // 123 / 125
    EXPECT_EQ(kConverter.machTimeFromNanoseconds(124), 2u); // 372 / 125 = 2.976
}

TEST(Ticks, ZeroTimeBaseGivesZero) {
    const TickConverter noDenom(TimeBase{.numer = 125, .denom = 0});
    EXPECT_EQ(noDenom.nanosecondsFromMachTime(1000), 0u);
    EXPECT_EQ(noDenom.machTimeFromNanoseconds(1000), 0u); // 0 * 1000 / 125
    const TickConverter noNumer(TimeBase{.numer = 0, .denom = 3});
    EXPECT_EQ(noNumer.nanosecondsFromMachTime(1000), 0u); // 0 * 1000 / 3
    EXPECT_EQ(noNumer.machTimeFromNanoseconds(1000), 0u);
    const TickConverter nothing(TimeBase{.numer = 0, .denom = 0});
    EXPECT_EQ(nothing.nanosecondsFromMachTime(1000), 0u);
    EXPECT_EQ(nothing.machTimeFromNanoseconds(1000), 0u);
}

TEST(Ticks, ProductsUseAllSixtyFourBits) {
    // (2^32 - 1) * (2^32 + 1) = 2^64 - 1
    const TickConverter largest(TimeBase{.numer = 4294967295u, .denom = 1});
    EXPECT_EQ(largest.nanosecondsFromMachTime(4294967297u), 18446744073709551615u);
    const TickConverter inverse(TimeBase{.numer = 1, .denom = 4294967295u});
    EXPECT_EQ(inverse.machTimeFromNanoseconds(4294967297u), 18446744073709551615u);
}

TEST(Ticks, ProductsWrapWithoutAWiderIntermediate) {
    // 147573952589676413 * 125 = 2^64 + 9, and 9 / 3 = 3; unwrapped it would be over 6 * 10^18.
    EXPECT_EQ(kConverter.nanosecondsFromMachTime(147573952589676413u), 3u);
    // One tick less: 2^64 - 116, still whole; / 3 = 6148914691236517166.67.
    EXPECT_EQ(kConverter.nanosecondsFromMachTime(147573952589676412u), 6148914691236517166u);
    // 6148914691236517206 * 3 = 2^64 + 2; with a numer of 1 that leaves 2.
    const TickConverter thirds(TimeBase{.numer = 1, .denom = 3});
    EXPECT_EQ(thirds.machTimeFromNanoseconds(6148914691236517206u), 2u);
}

TEST(Ticks, ReadsTheClocksTimeBaseOnce) {
    testing::StrictMock<MockClock> clock;
    EXPECT_CALL(clock, timeBase()).Times(1).WillOnce(testing::Return(TimeBase{.numer = 125, .denom = 3}));
    const TickConverter converter(clock);
    const TickConverter copy = converter;
    EXPECT_EQ(converter.nanosecondsFromMachTime(24), 1000u);
    EXPECT_EQ(converter.machTimeFromNanoseconds(1000), 24u);
    EXPECT_EQ(copy.nanosecondsFromMachTime(24), 1000u);
}

} // namespace
} // namespace ZorvaTouch

#include "Shared/Util/Numeric.h"

#include <cmath>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

using Util::truncateToInt32;
using Util::truncateToUint64;

constexpr float kInfinity = std::numeric_limits<float>::infinity();
constexpr float kNan = std::numeric_limits<float>::quiet_NaN();
constexpr double kWideInfinity = std::numeric_limits<double>::infinity();
constexpr double kWideNan = std::numeric_limits<double>::quiet_NaN();

TEST(Numeric, Int32TruncatesTowardZero) {
    EXPECT_EQ(truncateToInt32(0.0f), 0);
    EXPECT_EQ(truncateToInt32(-0.0f), 0);
    EXPECT_EQ(truncateToInt32(0.999f), 0);
    EXPECT_EQ(truncateToInt32(-0.999f), 0);
    EXPECT_EQ(truncateToInt32(1.5f), 1);
    EXPECT_EQ(truncateToInt32(-1.5f), -1);
    EXPECT_EQ(truncateToInt32(-2.0f), -2);
    EXPECT_EQ(truncateToInt32(1e-40f), 0); // denormal
}

TEST(Numeric, Int32SaturatesAtBothEnds) {
    // The floats next to 2^31 are 128 below and 256 above it.
    EXPECT_EQ(truncateToInt32(2147483520.0f), 2147483520);
    EXPECT_EQ(truncateToInt32(2147483648.0f), 2147483647);
    EXPECT_EQ(truncateToInt32(3e38f), 2147483647);
    EXPECT_EQ(truncateToInt32(kInfinity), 2147483647);
    EXPECT_EQ(truncateToInt32(-2147483520.0f), -2147483520);
    EXPECT_EQ(truncateToInt32(-2147483648.0f), -2147483647 - 1);
    EXPECT_EQ(truncateToInt32(-2147483904.0f), -2147483647 - 1);
    EXPECT_EQ(truncateToInt32(-kInfinity), -2147483647 - 1);
}

TEST(Numeric, Int32OfNanIsZero) {
    EXPECT_EQ(truncateToInt32(kNan), 0);
    EXPECT_EQ(truncateToInt32(std::copysign(kNan, -1.0f)), 0);
}

TEST(Numeric, Uint64TruncatesTowardZero) {
    EXPECT_EQ(truncateToUint64(0.0), 0u);
    EXPECT_EQ(truncateToUint64(0.999), 0u);
    EXPECT_EQ(truncateToUint64(1.999), 1u);
    EXPECT_EQ(truncateToUint64(4294967296.5), 4294967296u);
    EXPECT_EQ(truncateToUint64(5e-324), 0u); // smallest denormal
}

TEST(Numeric, Uint64SaturatesAtBothEnds) {
    // The double next below 2^64 is 2048 below it.
    EXPECT_EQ(truncateToUint64(18446744073709549568.0), 18446744073709549568u);
    EXPECT_EQ(truncateToUint64(9223372036854775808.0), 9223372036854775808u); // 2^63
    EXPECT_EQ(truncateToUint64(18446744073709551616.0), 18446744073709551615u);
    EXPECT_EQ(truncateToUint64(1e300), 18446744073709551615u);
    EXPECT_EQ(truncateToUint64(kWideInfinity), 18446744073709551615u);
    EXPECT_EQ(truncateToUint64(-0.0), 0u);
    EXPECT_EQ(truncateToUint64(-0.5), 0u);
    EXPECT_EQ(truncateToUint64(-1.0), 0u);
    EXPECT_EQ(truncateToUint64(-1e300), 0u);
    EXPECT_EQ(truncateToUint64(-kWideInfinity), 0u);
}

TEST(Numeric, Uint64OfNanIsZero) {
    EXPECT_EQ(truncateToUint64(kWideNan), 0u);
    EXPECT_EQ(truncateToUint64(std::copysign(kWideNan, -1.0)), 0u);
}

} // namespace
} // namespace ZorvaTouch

#include "Host/Linux/IioScan.h"

#include <gtest/gtest.h>

#include <limits>

namespace ZorvaTouch::Linux {
namespace {

using Bytes = std::vector<std::uint8_t>;
using Axes = std::array<float, 3>;

ScanType typeOf(std::string_view text) { return parseScanType(text).value(); }

double raw(std::string_view type, const Bytes &bytes) { return decodeRaw(typeOf(type), bytes); }

constexpr IioScan::Conversions kMilliG{{{0, 0.00980665}, {0, 0.00980665}, {0, 0.00980665}}};
constexpr IioScan::Conversions kG{{{0, 9.80665}, {0, 9.80665}, {0, 9.80665}}};

std::vector<ScanElement> axesOf(std::string_view type) {
    return {
        {"in_accel_x", 0, typeOf(type)}, {"in_accel_y", 1, typeOf(type)}, {"in_accel_z", 2, typeOf(type)}};
}
std::vector<ScanElement> withTime(std::vector<ScanElement> elements) {
    elements.push_back({kTimestampElement, 9, typeOf("le:s64/64>>0")});
    return elements;
}

// --- Values ------------------------------------------------------------------------------------------------

TEST(IioValue, IsInTheOrderOfItsBytes) {
    EXPECT_EQ(raw("le:u16/16", {0x34, 0x12}), 0x1234);
    EXPECT_EQ(raw("be:u16/16", {0x12, 0x34}), 0x1234);
    EXPECT_EQ(raw("le:u32/32", {0x78, 0x56, 0x34, 0x12}), 0x12345678);
    EXPECT_EQ(raw("be:u32/32", {0x12, 0x34, 0x56, 0x78}), 0x12345678);
    EXPECT_EQ(raw("le:u8/8", {0xFE}), 254);
}

TEST(IioValue, IsSignedByItsTopBitThatCounts) {
    EXPECT_EQ(raw("le:s8/8", {0xFE}), -2);
    EXPECT_EQ(raw("le:s12/16>>4", {0x10, 0x80}), -2047);
    EXPECT_EQ(raw("le:u12/16>>4", {0x10, 0x80}), 2049);
    EXPECT_EQ(raw("be:s12/16>>4", {0x7F, 0xFF}), 2047) << "what is below does not count";
    EXPECT_EQ(raw("le:s12/16", {0xFF, 0x17}), 2047) << "nor what is above";
    EXPECT_EQ(raw("le:s12/16", {0x00, 0xF8}), -2048);
    EXPECT_EQ(raw("le:s1/8>>7", {0x80}), -1);
    EXPECT_EQ(raw("le:u1/8>>7", {0x80}), 1);
}

TEST(IioValue, MayTakeAllBits) {
    EXPECT_EQ(raw("le:s64/64", Bytes(8, 0xFF)), -1);
    EXPECT_EQ(raw("le:u64/64", Bytes(8, 0xFF)), 18446744073709551616.0);
    EXPECT_EQ(raw("be:s64/64", {0x80, 0, 0, 0, 0, 0, 0, 0}), -9223372036854775808.0);
    EXPECT_EQ(raw("le:s32/32", {0, 0, 0, 0x80}), -2147483648.0);
}

// --- Layout ------------------------------------------------------------------------------------------------

TEST(IioScanLayout, PutsTheTimeAtAMultipleOfEight) {
    EXPECT_EQ(IioScan::create(withTime(axesOf("le:s32/32>>0")), kMilliG)->size(), 24u) << "12, 4 between, 8";
    EXPECT_EQ(IioScan::create(withTime(axesOf("le:s16/16>>0")), kMilliG)->size(), 16u) << "6, 2 between, 8";
    EXPECT_EQ(IioScan::create(withTime(axesOf("le:s8/8>>0")), kMilliG)->size(), 16u);
    EXPECT_EQ(IioScan::create(axesOf("le:s16/16>>0"), kMilliG)->size(), 6u);
    EXPECT_FALSE(IioScan::create(axesOf("le:s16/16>>0"), kMilliG)->hasTimestamp());
}

TEST(IioScanLayout, GoesByTheIndexAndCountsOtherElements) {
    const auto scan = IioScan::create({{"in_temp", 3, typeOf("le:s32/32>>0")},
                                       {"in_accel_z", 4, typeOf("le:s8/8>>0")},
                                       {"in_accel_x", 2, typeOf("le:s8/8>>0")},
                                       {"in_accel_y", 1, typeOf("le:s16/16>>0")}},
                                      kG);
    ASSERT_TRUE(scan);
    EXPECT_EQ(scan->size(), 12u) << "y at 0, x at 2, the temperature at 4, z at 8, and up to a multiple of 4";
    EXPECT_EQ(scan->decode(Bytes{2, 0, 1, 99, 99, 99, 99, 99, 3, 99, 99, 99}),
              (AccelSample{.g = {1, 2, 3}, .nanoseconds = {}}));
}

TEST(IioScanLayout, StepsOverRows) {
    const auto scan = IioScan::create({{"in_accel_x", 0, typeOf("le:s8/8>>0")},
                                       {"in_rot", 1, typeOf("le:s16/16X4>>0")},
                                       {"in_accel_y", 2, typeOf("le:s8/8>>0")},
                                       {"in_accel_z", 3, typeOf("le:s8/8>>0")}},
                                      kG);
    ASSERT_TRUE(scan);
    EXPECT_EQ(scan->size(), 24u);
    Bytes bytes(24, 99);
    bytes[0] = 1;
    bytes[16] = 2;
    bytes[17] = 3;
    EXPECT_EQ(scan->decode(bytes).g, (Axes{1, 2, 3}));
}

TEST(IioScanLayout, NeedsEachAxisAndEachIndexOnce) {
    for (std::size_t missing = 0; missing < 3; ++missing) {
        auto elements = axesOf("le:s16/16>>0");
        elements.erase(elements.begin() + static_cast<std::ptrdiff_t>(missing));
        EXPECT_FALSE(IioScan::create(withTime(elements), kG));
    }
    auto elements = axesOf("le:s16/16>>0");
    elements[2].index = 0;
    EXPECT_FALSE(IioScan::create(elements, kG));
    elements[2] = {"in_accel_z", 2, typeOf("le:s16/16X2>>0")};
    EXPECT_FALSE(IioScan::create(elements, kG)) << "which of the two?";
    EXPECT_FALSE(IioScan::create({}, kG));
}

// --- Samples -----------------------------------------------------------------------------------------------

TEST(IioSample, IsInGWithItsTimeInNanoseconds) {
    const auto scan = IioScan::create(withTime(axesOf("le:s32/32>>0")), kMilliG);
    ASSERT_TRUE(scan);
    // 250, -500 and 1000 thousandths of g; 0x0102030405060708 ns.
    const Bytes bytes{0xFA, 0, 0, 0, 0x0C, 0xFE, 0xFF, 0xFF, 0xE8, 0x03, 0, 0,
                      9,    9, 9, 9, 8,    7,    6,    5,    4,    3,    2, 1};
    EXPECT_EQ(scan->decode(bytes),
              (AccelSample{.g = {0.25f, -0.5f, 1.0f}, .nanoseconds = 0x0102030405060708}));
}

TEST(IioSample, AddsTheOffsetBeforeItScales) {
    const auto scan =
        IioScan::create(axesOf("le:u8/8>>0"), {{{-100, 9.80665}, {0, -9.80665}, {0.5, 19.6133}}});
    ASSERT_TRUE(scan);
    EXPECT_EQ(scan->decode(Bytes{103, 4, 1}).g, (Axes{3, -4, 3}));
}

TEST(IioSample, IsNarrowedOnce) {
    const auto scan = IioScan::create(axesOf("le:s8/8>>0"), {{{0, 0.038307}, {0, 0.038307}, {0, 0.038307}}});
    ASSERT_TRUE(scan);
    EXPECT_EQ(scan->decode(Bytes{1, 0, 0}).g[0], 0.00390622695f) << "as floats from the start, ...672";
}

TEST(IioSample, StaysANumberWhateverTheScale) {
    const auto scan = IioScan::create(axesOf("le:s8/8>>0"), {{{0, 1e300}, {0, -1e300}, {1e308, 1e308}}});
    ASSERT_TRUE(scan);
    constexpr float kLargest = std::numeric_limits<float>::max();
    EXPECT_EQ(scan->decode(Bytes{1, 1, 1}).g, (Axes{kLargest, -kLargest, kLargest}));
}

TEST(IioSample, MayHaveANegativeTime) {
    const auto scan = IioScan::create(withTime(axesOf("le:s8/8>>0")), kG);
    ASSERT_TRUE(scan);
    Bytes bytes(16, 0);
    std::fill(bytes.begin() + 8, bytes.end(), std::uint8_t{0xFF});
    EXPECT_EQ(scan->decode(bytes).nanoseconds, -1);
}

} // namespace
} // namespace ZorvaTouch::Linux

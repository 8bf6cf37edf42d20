#include "Shared/Util/Bytes.h"

#include <array>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

TEST(Bytes, LoadsLittleEndianFromAnyAddress) {
    const std::array<std::uint8_t, 6> bytes{0xEE, 0x12, 0x34, 0x56, 0x78, 0xEE};
    EXPECT_EQ(Util::loadLittle16(bytes.data() + 1), 0x3412);
    EXPECT_EQ(Util::loadLittle32(bytes.data() + 1), 0x78563412u);
}

TEST(Bytes, LoadsTheHighestBit) {
    const std::array<std::uint8_t, 4> bytes{0x00, 0x80, 0x00, 0x80};
    EXPECT_EQ(Util::loadLittle16(bytes.data()), 0x8000);
    EXPECT_EQ(Util::loadLittle32(bytes.data()), 0x80008000u);
    const std::array<std::uint8_t, 4> ones{0xFF, 0xFF, 0xFF, 0xFF};
    EXPECT_EQ(Util::loadLittle16(ones.data()), 65535);
    EXPECT_EQ(Util::loadLittle32(ones.data()), 4294967295u);
}

TEST(Bytes, StoresLittleEndianAndNothingBeside) {
    std::array<std::uint8_t, 8> bytes{};
    Util::storeLittle16(bytes.data() + 1, 0x3412);
    EXPECT_EQ(bytes, (std::array<std::uint8_t, 8>{0, 0x12, 0x34, 0, 0, 0, 0, 0}));
    Util::storeLittle32(bytes.data() + 3, 0xFE785634u);
    EXPECT_EQ(bytes, (std::array<std::uint8_t, 8>{0, 0x12, 0x34, 0x34, 0x56, 0x78, 0xFE, 0}));
}

} // namespace
} // namespace ZorvaTouch

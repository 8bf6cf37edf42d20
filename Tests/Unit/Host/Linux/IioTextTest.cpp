#include "Host/Linux/IioText.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Linux {
namespace {

TEST(IioText, ReadsHowAValueLiesInAScan) {
    EXPECT_EQ(parseScanType("le:s32/32>>0"), (ScanType{.isSigned = true, .bits = 32, .storageBits = 32}));
    EXPECT_EQ(parseScanType("be:u12/16>>4"),
              (ScanType{.isBigEndian = true, .bits = 12, .storageBits = 16, .shift = 4}));
    EXPECT_EQ(parseScanType("le:s16/32X4>>8"),
              (ScanType{.isSigned = true, .bits = 16, .storageBits = 32, .repeat = 4, .shift = 8}));
    EXPECT_EQ(parseScanType("le:u64/64"), (ScanType{.bits = 64, .storageBits = 64}));
    EXPECT_EQ(parseScanType("le:s1/8>>7"),
              (ScanType{.isSigned = true, .bits = 1, .storageBits = 8, .shift = 7}));
}

TEST(IioText, ReadsNoOtherForm) {
    for (const char *const text : {"",
                                   "le",
                                   "le:",
                                   "le:s",
                                   "le:s32",
                                   "le:s32/",
                                   "le:s32/32>>",
                                   "le:s32/32>",
                                   "le:s32/32X",
                                   "me:s32/32",
                                   "le:f32/32",
                                   "LE:s32/32",
                                   " le:s32/32",
                                   "le:s32/32>>0 ",
                                   "le:s32/32>>0\n",
                                   "le:s-1/32",
                                   "le:s+1/32",
                                   "le:s32/32>>-1",
                                   "le:s 32/32",
                                   "le:s4294967297/32",
                                   "le:s32/99999999999999999999"})
        EXPECT_EQ(parseScanType(text), std::nullopt) << text;
}

TEST(IioText, RefusesWhatCannotBe) {
    EXPECT_EQ(parseScanType("le:s0/32"), std::nullopt) << "no bits";
    EXPECT_EQ(parseScanType("le:s65/64"), std::nullopt) << "more bits than there are";
    EXPECT_EQ(parseScanType("le:s33/32"), std::nullopt);
    EXPECT_EQ(parseScanType("le:s16/0"), std::nullopt);
    EXPECT_EQ(parseScanType("le:s4/4"), std::nullopt) << "half a byte";
    EXPECT_EQ(parseScanType("le:s24/24"), std::nullopt);
    EXPECT_EQ(parseScanType("le:s64/128"), std::nullopt);
    EXPECT_EQ(parseScanType("le:s12/16>>5"), std::nullopt) << "beyond the top";
    EXPECT_EQ(parseScanType("le:s32/32>>32"), std::nullopt);
    EXPECT_EQ(parseScanType("le:s32/32>>4294967295"), std::nullopt);
    EXPECT_EQ(parseScanType("le:s32/32X0"), std::nullopt);
    EXPECT_EQ(parseScanType("le:s32/32X3"), std::nullopt);
    EXPECT_EQ(parseScanType("le:s32/32X32"), std::nullopt);
}

TEST(IioText, AValueTakesItsStorageAsOftenAsItIsRepeated) {
    EXPECT_EQ(parseScanType("be:u12/16>>4")->size(), 2u);
    EXPECT_EQ(parseScanType("le:s16/32X4>>8")->size(), 16u);
}

TEST(IioText, ReadsCounts) {
    EXPECT_EQ(parseIioCount("0"), 0u);
    EXPECT_EQ(parseIioCount("4294967295"), 4294967295u);
    for (const char *const text : {"", "-1", "+1", " 1", "1 ", "1.0", "0x1", "one", "4294967296"})
        EXPECT_EQ(parseIioCount(text), std::nullopt) << text;
}

TEST(IioText, ReadsNumbers) {
    EXPECT_EQ(parseIioNumber("0.009806650"), 0.00980665);
    EXPECT_EQ(parseIioNumber("-12.5"), -12.5);
    EXPECT_EQ(parseIioNumber("100"), 100.0);
    EXPECT_EQ(parseIioNumber("1e-3"), 0.001);
    for (const char *const text :
         {"", "x", "1 ", " 1", "1,5", "inf", "nan", "-inf", "1e999", "1.2.3", "0.1 m/s"})
        EXPECT_EQ(parseIioNumber(text), std::nullopt) << text;
}

TEST(IioText, TheClosestFrequencyIsTheLowestThatIsEnough) {
    EXPECT_EQ(closestFrequency("12.5 25 50.000000 100 200", 40), "50.000000");
    EXPECT_EQ(closestFrequency("200 100 50 25", 100), "100");
    EXPECT_EQ(closestFrequency("12.5 25 50", 100), "50") << "none is enough";
    EXPECT_EQ(closestFrequency("  25   0 -50 x 100 ", 30), "100") << "what is none is passed over";
    EXPECT_EQ(closestFrequency("", 30), std::nullopt);
    EXPECT_EQ(closestFrequency("   ", 30), std::nullopt);
    EXPECT_EQ(closestFrequency("[1 2]", 1), std::nullopt);
}

} // namespace
} // namespace ZorvaTouch::Linux

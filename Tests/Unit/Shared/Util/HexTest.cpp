#include "Shared/Util/Hex.h"

#include <stdexcept>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

using Bytes = std::vector<std::uint8_t>;
using Util::bytesFromHexString;
using Util::hexStringFromBytes;

void expectBadByte(std::string_view text) {
    EXPECT_THAT([text] { (void)bytesFromHexString(text); },
                testing::ThrowsMessage<std::invalid_argument>(testing::StrEq("invalid hex string")))
        << text;
}

TEST(Hex, WritesTwoLowerCaseDigitsAndASpacePerByte) {
    EXPECT_EQ(hexStringFromBytes(Bytes{0x00, 0x0F}), "00 0f ");
    EXPECT_EQ(hexStringFromBytes(Bytes{0x01, 0xAB, 0xFF}), "01 ab ff ");
    EXPECT_EQ(hexStringFromBytes(Bytes{0x7F, 0x80, 0xA9}), "7f 80 a9 ");
}

TEST(Hex, WritesNothingForNoBytes) { EXPECT_EQ(hexStringFromBytes(Bytes{}), ""); }

TEST(Hex, AppendsToWhatIsThere) {
    std::string text = "data: ";
    Util::appendHexString(text, Bytes{0xCA, 0xFE});
    EXPECT_EQ(text, "data: ca fe ");
    Util::appendHexString(text, Bytes{});
    EXPECT_EQ(text, "data: ca fe ");
}

TEST(Hex, ReadsTokensInEitherCaseAndWidth) {
    EXPECT_EQ(bytesFromHexString("01 ab ff"), (Bytes{0x01, 0xAB, 0xFF}));
    EXPECT_EQ(bytesFromHexString("01 AB Ff aB "), (Bytes{0x01, 0xAB, 0xFF, 0xAB}));
    EXPECT_EQ(bytesFromHexString("1 2 3"), (Bytes{0x01, 0x02, 0x03}));
    EXPECT_EQ(bytesFromHexString("f"), (Bytes{0x0F}));
    EXPECT_EQ(bytesFromHexString("0"), (Bytes{0x00}));
}

TEST(Hex, ReadsLeadingZerosAndAPrefix) {
    EXPECT_EQ(bytesFromHexString("00ff 0000000000000000007f"), (Bytes{0xFF, 0x7F}));
    EXPECT_EQ(bytesFromHexString("0x1 0X2 0xFf 0x00ff"), (Bytes{0x01, 0x02, 0xFF, 0xFF}));
    EXPECT_EQ(bytesFromHexString("01 02 0x03 04 "), (Bytes{0x01, 0x02, 0x03, 0x04}));
}

TEST(Hex, AnyWhiteSpaceSeparates) {
    EXPECT_EQ(bytesFromHexString("  01\t02\n03\v04\f05\r06\r\n\n 07  "), (Bytes{1, 2, 3, 4, 5, 6, 7}));
    EXPECT_EQ(bytesFromHexString("\n01 02"), (Bytes{1, 2}));
}

TEST(Hex, EmptyTextsAreNoBytes) {
    EXPECT_EQ(bytesFromHexString(""), Bytes{});
    EXPECT_EQ(bytesFromHexString("   "), Bytes{});
    EXPECT_EQ(bytesFromHexString(" \t\r\n"), Bytes{});
}

TEST(Hex, StopsQuietlyAtTheFirstTokenThatIsNoNumber) {
    EXPECT_EQ(bytesFromHexString("01 zz 02"), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("ff g0 01"), (Bytes{0xFF}));
    EXPECT_EQ(bytesFromHexString("zz"), Bytes{});
    EXPECT_EQ(bytesFromHexString("0g 01"), Bytes{});
    EXPECT_EQ(bytesFromHexString("01 02, 03"), (Bytes{0x01})); // whole tokens: "02," is none
    EXPECT_EQ(bytesFromHexString("01 2-3 04"), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 0x 02"), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 0x0x2 03"), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 x2 03"), (Bytes{0x01}));
}

TEST(Hex, SignsAreNoNumbers) {
    EXPECT_EQ(bytesFromHexString("01 +2 03"), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 -2 03"), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 -0 03"), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 0x-2 03"), (Bytes{0x01}));
}

TEST(Hex, OtherBytesAreNoNumbers) {
    using namespace std::string_view_literals;
    EXPECT_EQ(bytesFromHexString("01 \x00 02 "sv), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 0\x00 02 "sv), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 \xFF\xFF 02 "sv), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01\xA0"
                                 "02 03"sv),
              Bytes{});                                   // a Latin-1 no-break space separates nothing
    EXPECT_EQ(bytesFromHexString("/: @G `g"sv), Bytes{}); // the neighbours of the digits in ASCII
    EXPECT_EQ(bytesFromHexString("01 :1 02 "sv), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 1/ 02 "sv), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 @1 02 "sv), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 1` 02 "sv), (Bytes{0x01}));
}

TEST(Hex, StopsQuietlyAtANumberOfMoreThanSixteenBits) {
    EXPECT_EQ(bytesFromHexString("01 10000 02"), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("01 123456789abcdef01 02"), (Bytes{0x01}));
    EXPECT_EQ(bytesFromHexString("0x10000"), Bytes{});
}

TEST(Hex, NumbersFrom256To65535AreBadBytes) {
    EXPECT_EQ(bytesFromHexString("ff"), (Bytes{0xFF}));
    expectBadByte("100");
    expectBadByte("ff 100");
    expectBadByte("ffff");
    expectBadByte("0x0100");
    expectBadByte("01 02 0100 03 ");
    expectBadByte("0102");
}

TEST(Hex, WhatFollowsTheEndIsNotRead) {
    EXPECT_EQ(bytesFromHexString("01 zz 100"), (Bytes{0x01})); // the bad byte stands after the end
}

TEST(Hex, ReadsIntoABufferThatIsClearedFirst) {
    Bytes bytes{9, 9, 9, 9};
    bytesFromHexString("01 02 ", bytes);
    EXPECT_EQ(bytes, (Bytes{1, 2}));
    bytesFromHexString("", bytes);
    EXPECT_EQ(bytes, Bytes{});
}

TEST(Hex, EveryByteReadsBackFromWhatWasWritten) {
    Bytes all;
    for (unsigned value = 0; value < 256; ++value)
        all.push_back(static_cast<std::uint8_t>(value));
    const std::string text = hexStringFromBytes(all);
    EXPECT_EQ(text.size(), 768u);
    EXPECT_EQ(bytesFromHexString(text), all);
}

} // namespace
} // namespace ZorvaTouch

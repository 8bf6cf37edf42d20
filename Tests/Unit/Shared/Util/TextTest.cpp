#include "Shared/Util/Text.h"

#include <cmath>
#include <cstdlib>
#include <limits>
#include <vector>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kNan = std::numeric_limits<double>::quiet_NaN();

std::string integer(std::int64_t value, std::size_t width = 0) {
    std::string text;
    Util::appendInteger(text, value, width);
    return text;
}

std::string fixed(double value) {
    std::string text;
    Util::appendFixed(text, value);
    return text;
}

std::string shortest(double value) {
    std::string text;
    Util::appendShortest(text, value);
    return text;
}

TEST(Text, IntegersArePaddedOnTheLeft) {
    EXPECT_EQ(integer(7, 4), "   7");
    EXPECT_EQ(integer(-7, 4), "  -7");
    EXPECT_EQ(integer(0, 2), " 0");
    EXPECT_EQ(integer(1234, 4), "1234");
}

TEST(Text, IntegersWiderThanTheirFieldAreWhole) {
    EXPECT_EQ(integer(12345, 4), "12345");
    EXPECT_EQ(integer(-1234, 4), "-1234");
    EXPECT_EQ(integer(42), "42");
    EXPECT_EQ(integer(std::numeric_limits<std::int64_t>::min()), "-9223372036854775808");
    EXPECT_EQ(integer(std::numeric_limits<std::int64_t>::max()), "9223372036854775807");
}

TEST(Text, UnsignedIntegersUseAllBits) {
    std::string text;
    Util::appendUnsigned(text, 0);
    text += ' ';
    Util::appendUnsigned(text, 18446744073709551615u);
    EXPECT_EQ(text, "0 18446744073709551615");
}

TEST(Text, FixedHasSixDecimals) {
    EXPECT_EQ(fixed(0.0), "0.000000");
    EXPECT_EQ(fixed(-0.0), "-0.000000");
    EXPECT_EQ(fixed(1.5), "1.500000");
    EXPECT_EQ(fixed(-2.4116), "-2.411600");
    EXPECT_EQ(fixed(static_cast<double>(0.1f)), "0.100000"); // 0.100000001490116
    EXPECT_EQ(fixed(1e22), "10000000000000000000000.000000");
}

TEST(Text, FixedRoundsToTheNearestAndTiesToEven) {
    EXPECT_EQ(fixed(0.0000004), "0.000000");
    EXPECT_EQ(fixed(-0.0000004), "-0.000000");
    EXPECT_EQ(fixed(0.9999996), "1.000000");
    EXPECT_EQ(fixed(0.0078125), "0.007812"); // 2^-7 exactly: halfway, 2 is even
    EXPECT_EQ(fixed(0.0234375), "0.023438"); // 3 * 2^-7 exactly: halfway, 7 is odd
}

TEST(Text, FixedNamesWhatIsNoNumber) {
    EXPECT_EQ(fixed(kInfinity), "inf");
    EXPECT_EQ(fixed(-kInfinity), "-inf");
    EXPECT_EQ(fixed(kNan), "nan");
    EXPECT_EQ(fixed(std::copysign(kNan, -1.0)), "nan"); // the sign of a NaN differs between machines
}

TEST(Text, FixedHoldsTheLargestDouble) {
    const std::string text = fixed(-std::numeric_limits<double>::max());
    EXPECT_EQ(text.size(), 317u); // sign, 309 digits, point, 6 decimals
    EXPECT_EQ(text.substr(0, 18), "-17976931348623157");
    EXPECT_EQ(text.substr(310), ".000000");
}

TEST(Text, ShortestKeepsTheMarkOfAFloatingPointNumber) {
    EXPECT_EQ(shortest(0.0), "0.0");
    EXPECT_EQ(shortest(-0.0), "-0.0");
    EXPECT_EQ(shortest(200.0), "200.0");
    EXPECT_EQ(shortest(-1.0), "-1.0");
    EXPECT_EQ(shortest(4294967296.0), "4294967296.0");
    EXPECT_EQ(shortest(1e22), "1e+22");
}

TEST(Text, ShortestUsesNoMoreDigitsThanItNeeds) {
    EXPECT_EQ(shortest(0.1), "0.1");
    EXPECT_EQ(shortest(-0.5), "-0.5");
    EXPECT_EQ(shortest(0.30000000000000004), "0.30000000000000004");
    EXPECT_EQ(shortest(static_cast<double>(0.1f)), "0.10000000149011612"); // a float keeps its own value
    EXPECT_EQ(shortest(5e-324), "5e-324");
    EXPECT_EQ(shortest(1.7976931348623157e308), "1.7976931348623157e+308");
}

TEST(Text, ShortestReadsBackAndIsFloatingPointEverywhere) {
    const std::vector<double> values{
        1e-7,  9.5e-5, 1e-4, 123456.75, 1e15,    1e16,   1e17, 9007199254740992.0,
        1e100, 1e-100, 1e21, -1e16,     2.5e-10, 1.0 / 3};
    for (const double value : values) {
        const std::string text = shortest(value);
        EXPECT_EQ(std::strtod(text.c_str(), nullptr), value) << text;
        EXPECT_NE(text.find_first_of(".e"), std::string::npos) << text;
        EXPECT_NE(text.back(), '.') << text;
    }
}

TEST(Text, EverythingIsAppended) {
    std::string text = "x";
    Util::appendInteger(text, 1, 3);
    Util::appendUnsigned(text, 2);
    Util::appendFixed(text, 3);
    Util::appendShortest(text, 4);
    Util::appendFixed(text, kNan);
    EXPECT_EQ(text, "x  123.0000004.0nan");
}

// The first and the last sequence of each length, and the ones on both sides of the surrogates.
const std::vector<std::string> kValidUtf8{
    "",
    "plain",
    std::string("a\0b", 3),
    "\x7F",
    "\xC2\x80",
    "\xDF\xBF",
    "\xE0\xA0\x80",
    "\xED\x9F\xBF",
    "\xEE\x80\x80",
    "\xEF\xBF\xBF",
    "\xF0\x90\x80\x80",
    "\xF4\x8F\xBF\xBF",
    "gr\xC3\xBC\xC3\x9F \xE2\x82\xAC \xF0\x9F\x98\x80",
};

TEST(Text, WellFormedUtf8IsLeftAlone) {
    for (const std::string &text : kValidUtf8) {
        EXPECT_TRUE(Util::isValidUtf8(text)) << text;
        EXPECT_EQ(Util::repairUtf8(text), text);
    }
}

struct BrokenText {
    const char *text;
    const char *repaired;
};

#define REPLACED "\xEF\xBF\xBD"

// A sequence that began well and breaks off is replaced as one; a byte that can neither begin nor continue
// one is replaced by itself.
const std::vector<BrokenText> kBrokenUtf8{
    {"\x80", REPLACED},                                        // continuation without a lead
    {"a\xFFz", "a" REPLACED "z"},                              // no lead at all
    {"\xFE\xFE", REPLACED REPLACED},                           //
    {"\xC0\x80", REPLACED REPLACED},                           // overlong NUL
    {"\xC1\xBF", REPLACED REPLACED},                           // overlong DEL
    {"\xE0\x9F\xBF", REPLACED REPLACED REPLACED},              // overlong U+07FF
    {"\xF0\x8F\xBF\xBF", REPLACED REPLACED REPLACED REPLACED}, // overlong U+FFFF
    {"\xED\xA0\x80", REPLACED REPLACED REPLACED},              // surrogate U+D800
    {"\xED\xBF\xBF", REPLACED REPLACED REPLACED},              // surrogate U+DFFF
    {"\xF4\x90\x80\x80", REPLACED REPLACED REPLACED REPLACED}, // U+110000
    {"\xF5\x80\x80\x80", REPLACED REPLACED REPLACED REPLACED}, // beyond
    {"\xC3", REPLACED},                                        // breaks off at the end
    {"\xE2\x82", REPLACED},                                    //
    {"\xF0\x9F\x98", REPLACED},                                //
    {"\xC3z", REPLACED "z"},                                   // breaks off before another character
    {"\xE2\x82z", REPLACED "z"},                               //
    {"\xF0\x9F\x98\xC3\xBC", REPLACED "\xC3\xBC"},             // the next sequence is kept
    {"\xE2\x82\xAC\x82", "\xE2\x82\xAC" REPLACED},             // one continuation too many
};

TEST(Text, MalformedUtf8IsReplaced) {
    for (const BrokenText &broken : kBrokenUtf8) {
        EXPECT_FALSE(Util::isValidUtf8(broken.text)) << broken.text;
        EXPECT_EQ(Util::repairUtf8(broken.text), broken.repaired);
        EXPECT_TRUE(Util::isValidUtf8(broken.repaired));
    }
}

#undef REPLACED

TEST(Text, PrintableEscapesAllThatControlsATerminal) {
    EXPECT_EQ(Util::printable("plain \\ text"), "plain \\ text");
    EXPECT_EQ(Util::printable("a\nb\rc\td"), "a\\nb\\rc\\td");
    EXPECT_EQ(Util::printable(std::string_view("\0\x07\x1b[2J\x1f\x7f", 8)), "\\x00\\x07\\x1b[2J\\x1f\\x7f");
    EXPECT_EQ(Util::printable("\xC2\x80\xC2\x9B\xC2\x9F"), "\\u0080\\u009b\\u009f");
    EXPECT_EQ(Util::printable("\xC2\xA0\xC3\xA9\xE2\x82\xAC"),
              "\xC2\xA0\xC3\xA9\xE2\x82\xAC"); // U+00A0 and on stay
    EXPECT_EQ(Util::printable("\x9B"
                              "31m"),
              "\xEF\xBF\xBD"
              "31m"); // a single byte
    EXPECT_EQ(Util::printable("\xC2"), "\xEF\xBF\xBD");
}

TEST(Text, LineBreaksAtTheEndAreLeftOut) {
    EXPECT_EQ(Util::withoutLineBreaksAtTheEnd("one\ntwo\r\n\n"), "one\ntwo");
    EXPECT_EQ(Util::withoutLineBreaksAtTheEnd(" kept "), " kept ");
    EXPECT_EQ(Util::withoutLineBreaksAtTheEnd("\r\n"), "");
    EXPECT_EQ(Util::withoutLineBreaksAtTheEnd(""), "");
}

} // namespace
} // namespace ZorvaTouch

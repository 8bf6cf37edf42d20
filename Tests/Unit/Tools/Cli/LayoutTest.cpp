#include "Tools/Cli/Layout.h"

#include <gtest/gtest.h>

#include <limits>

namespace ZorvaTouch::Tools {
namespace {

TEST(Layout, FixedPointNumbersAreCut) {
    EXPECT_EQ(fixedPointText(1'234'567, 1'000'000), "1.234");
    EXPECT_EQ(fixedPointText(1'999'999, 1'000'000), "1.999");
    EXPECT_EQ(fixedPointText(5'000'000, 1'000'000'000), "0.005");
    EXPECT_EQ(fixedPointText(50'000'000, 1'000'000'000), "0.050");
    EXPECT_EQ(fixedPointText(0, 1'000'000), "0.000");
    EXPECT_EQ(fixedPointText(-1'500'000'000, 1'000'000'000), "-1.500");
    EXPECT_EQ(fixedPointText(std::numeric_limits<std::int64_t>::min(), 1'000'000'000), "-9223372036.854");
}

TEST(Layout, DecimalsAreRounded) {
    EXPECT_EQ(decimalText(99.996, 2), "100.00");
    EXPECT_EQ(decimalText(99.994, 2), "99.99");
}

TEST(Layout, LinesAreWrappedAtEightyColumns) {
    const auto wrapped = [](const std::string &line, std::size_t column, std::string_view separator) {
        std::string text;
        appendWrapped(text, line, column, separator);
        return text;
    };
    const std::string word(39, 'x');
    EXPECT_EQ(wrapped(word + " " + word + "x", 0, " "), word + " " + word + "x") << "80 columns";
    EXPECT_EQ(wrapped(word + " " + word + "xx", 0, " "), word + "\n" + word + "xx");
    EXPECT_EQ(wrapped("a " + word, 40, " "), "a\n" + std::string(40, ' ') + word);
    EXPECT_EQ(wrapped("many words, few words, none", 60, ", "),
              "many words,\n" + std::string(60, ' ') + "few words, none");
    EXPECT_EQ(wrapped(std::string(90, 'x') + " y", 0, " "), std::string(90, 'x') + "\ny") << "stays whole";
}

TEST(Layout, WidthsCountCharacters) {
    EXPECT_EQ(widthOf("a → b"), 5u); // the arrow has three bytes
    std::string text;
    appendLeft(text, "→", 3);
    appendRight(text, "→", 3);
    appendRight(text, "long", 3);
    EXPECT_EQ(text, "→    →long");
}

} // namespace
} // namespace ZorvaTouch::Tools

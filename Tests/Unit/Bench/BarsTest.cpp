#include "Bench/Bars.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Bench {
namespace {

Bar barOf(double figure, double counterpart, Bar::Sense sense, double limit) {
    return {.name = "thing",
            .unit = "ns",
            .counterpartName = "other",
            .figure = figure,
            .counterpart = counterpart,
            .sense = sense,
            .limit = limit};
}

TEST(Bars, AtMostIsTheFigureDividedByItsCounterpart) {
    EXPECT_EQ(barOf(30, 120, Bar::Sense::AtMost, 0.25).ratio(), 0.25);
    EXPECT_TRUE(barOf(30, 120, Bar::Sense::AtMost, 0.25).passes());
    EXPECT_FALSE(barOf(31, 120, Bar::Sense::AtMost, 0.25).passes());
}

TEST(Bars, AtLeastIsHowManyTimesAsFast) {
    EXPECT_EQ(barOf(30, 120, Bar::Sense::AtLeast, 4).ratio(), 4);
    EXPECT_TRUE(barOf(30, 120, Bar::Sense::AtLeast, 4).passes());
    EXPECT_FALSE(barOf(31, 120, Bar::Sense::AtLeast, 4).passes());
}

TEST(Bars, NothingOfSomethingPassesALimitOfNothing) {
    EXPECT_TRUE(barOf(0, 26100, Bar::Sense::AtMost, 0).passes());
    EXPECT_FALSE(barOf(1, 26100, Bar::Sense::AtMost, 0).passes());
}

TEST(BarTable, HasALineForEachBar) {
    BarTable table;
    table.add(barOf(30, 120, Bar::Sense::AtMost, 0.25));
    Bar aimed = barOf(31.06, 120, Bar::Sense::AtLeast, 5);
    aimed.stretch = 6;
    table.add(aimed);
    Bar shown = barOf(0.125, 1, Bar::Sense::AtMost, 0);
    shown.limit.reset();
    table.add(shown);
    EXPECT_EQ(table.text(), "bar    figure   against       ratio  limit    verdict\n"
                            "thing  30 ns    other 120 ns  0.25   <= 0.25  pass\n"
                            "thing  31.1 ns  other 120 ns  3.86   >= 5     FAIL (stretch 6: missed)\n"
                            "thing  0.12 ns  other 1 ns    0.12   -        compare\n");
}

TEST(BarTable, ShowsThatLittleIsNotNothing) {
    BarTable table;
    table.add(barOf(7, 25000, Bar::Sense::AtMost, 0)); // 7 / 25000 = 0.00028
    EXPECT_EQ(table.text(), "bar    figure  against         ratio    limit  verdict\n"
                            "thing  7 ns    other 25000 ns  0.00028  <= 0   FAIL\n");
}

TEST(BarTable, ATimeThatIsMissedLeavesTheRunSound) {
    BarTable table;
    table.add(barOf(31, 120, Bar::Sense::AtMost, 0.25));
    EXPECT_TRUE(table.isSound());
}

TEST(BarTable, ACountThatIsMissedDoesNot) {
    BarTable table;
    Bar bar = barOf(1, 26100, Bar::Sense::AtMost, 0);
    bar.isBinding = true;
    table.add(bar);
    EXPECT_FALSE(table.isSound());
}

TEST(BarTable, ResultsThatDifferAreAnError) {
    BarTable table;
    table.addError("thing", "the texts differ");
    EXPECT_FALSE(table.empty());
    EXPECT_FALSE(table.isSound());
    EXPECT_EQ(table.text(), "bar  figure  against  ratio  limit  verdict\n"
                            "thing: FAIL, the texts differ\n");
}

} // namespace
} // namespace ZorvaTouch::Bench

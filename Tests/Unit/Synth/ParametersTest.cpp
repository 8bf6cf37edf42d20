#include "Synth/Parameters.h"

#include "Host/Runtime/Files.h"
#include "Shared/Util/Text.h"

#include <gtest/gtest.h>

#include <set>
#include <string>

namespace ZorvaTouch::Synth {
namespace {

TEST(SynthParameters, EachHasARowOfItsOwn) {
    Parameters marked;
    for (const ParameterInfo &info : parameters())
        marked.*info.value = 0;
    std::set<std::string_view> names;
    for (const ParameterInfo &info : parameters()) {
        EXPECT_EQ(marked.*info.value, 0) << info.name; // no other row has set it
        marked.*info.value = 1;
        EXPECT_TRUE(names.insert(info.name).second) << info.name;
    }
}

TEST(SynthParameters, BeginWithTheirDefaults) {
    const Parameters parameters;
    EXPECT_EQ(parameters.reportRate, 100);
    EXPECT_EQ(parameters.noise, 3);
    EXPECT_EQ(parameters.fingerWidth, 6);
    EXPECT_EQ(parameters.accelRate, 0);
}

TEST(SynthParameters, HaveUnitsMeaningsAndRangesAroundTheirDefaults) {
    for (const ParameterInfo &info : parameters()) {
        EXPECT_FALSE(info.unit.empty()) << info.name;
        EXPECT_FALSE(info.meaning.empty()) << info.name;
        EXPECT_GE(info.standard, info.lowest) << info.name;
        EXPECT_LE(info.standard, info.highest) << info.name;
    }
}

/// "0.2", "100"; what the tables of the page have.
std::string textOf(double value) {
    std::string text;
    Util::appendShortest(text, value);
    return text.ends_with(".0") ? text.substr(0, text.size() - 2) : text;
}

TEST(SynthParameters, AreOnThePageAsTheyAre) {
    const std::string page = Host::readFile(ZORVA_TEST_DIR "/../Docs/Synth.md");
    for (const ParameterInfo &info : parameters()) {
        std::string row("| `--");
        row.append(info.name).append("` | ").append(info.unit).append(" | ").append(textOf(info.standard));
        row.append(" | ").append(textOf(info.lowest)).append(" to ").append(textOf(info.highest));
        row.append(" | ").append(info.meaning).append(" |\n");
        EXPECT_NE(page.find(row), std::string::npos) << row;
    }
}

} // namespace
} // namespace ZorvaTouch::Synth

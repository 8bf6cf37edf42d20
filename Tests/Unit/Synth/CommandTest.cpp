#include "Tests/Unit/Tools/Cli/CliFixture.h"

#include "Shared/RecordingContainer.h"
#include "Synth/Parameters.h"
#include "Synth/Scenario.h"

#include <gmock/gmock.h>

// The command line's `synth`.

namespace ZorvaTouch::Tools {
namespace {

using SynthCommand = CliFixture;
using ::testing::AllOf;
using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::StartsWith;

TEST_F(SynthCommand, ListsTheScenarios) {
    const std::string list = outputOf({"synth", "--list"});
    EXPECT_THAT(list, StartsWith("idle          10 s  Nothing touches the sensor\n"));
    EXPECT_THAT(list,
                HasSubstr("\nlink-faults   20 s  Taps and holds with images lost and repeated (--drop-rate 5 "
                          "--repeat-rate 3)\n"));
    EXPECT_EQ(std::count(list.begin(), list.end(), '\n'), 13);
}

TEST_F(SynthCommand, HelpHasAFlagUnitAndDefaultForEachParameter) {
    const std::string help = outputOf({"synth", "--help"});
    for (const Synth::ParameterInfo &info : Synth::parameters())
        EXPECT_THAT(help, HasSubstr("--" + std::string(info.name) + " " + std::string(info.unit)));
    EXPECT_THAT(help, HasSubstr("Of each electrode in each image, sd (default: 3)\n"));
    EXPECT_THAT(help, HasSubstr("\n  zorvatouch synth "));
}

TEST_F(SynthCommand, WritesARecording) {
    EXPECT_EQ(outputOf({"synth", "--scenario", "taps", "--duration", "2", "-o", "@taps.json"}), "");
    const FrameList frames = readRecordingContainer(readFile("taps.json")).frames;
    EXPECT_GT(frames.size(), 198u);
    EXPECT_LT(frames.size(), 210u);
    EXPECT_THAT(outputOf({"replay", "@taps.json"}), HasSubstr(" tap "));
}

TEST_F(SynthCommand, WritesToStandardOutputToo) {
    static_cast<void>(
        outputOf({"synth", "--scenario", "grazes", "--seed", "3", "--duration", "1", "-o", "@a.json"}));
    EXPECT_EQ(outputOf({"synth", "--scenario", "grazes", "--seed", "3", "--duration", "1", "-o", "-"}),
              readFile("a.json"));
}

TEST_F(SynthCommand, SeedsAreAnyWholeNumber) {
    const std::string first = outputOf({"synth", "--duration", "0.5", "--seed", "0", "-o", "-"});
    const std::string last =
        outputOf({"synth", "--duration", "0.5", "--seed", "18446744073709551615", "-o", "-"});
    EXPECT_NE(first, last);
    EXPECT_EQ(outputOf({"synth", "--duration", "0.5", "-o", "-"}),
              outputOf({"synth", "--scenario", "day", "--seed", "1", "--duration", "0.5", "-o", "-"}));
}

TEST_F(SynthCommand, ParametersOverrideTheScenariosOwn) {
    const std::string rest =
        outputOf({"synth", "--scenario", "link-faults", "--duration", "10", "--drop-rate", "90", "-o", "-"});
    EXPECT_NEAR(static_cast<double>(readRecordingContainer(rest).frames.size()), 110,
                45); // of 1000, and labels
    const std::string fast =
        outputOf({"synth", "--scenario", "idle", "--duration", "1", "--report-rate", "500", "-o", "-"});
    EXPECT_NEAR(static_cast<double>(readRecordingContainer(fast).frames.size()), 500, 1);
}

TEST_F(SynthCommand, BadUsageIsOneLine) {
    const std::string hint = " (see zorvatouch synth --help)\n";
    EXPECT_EQ(errorOf({"synth"}), "zorvatouch: --output is required" + hint);
    EXPECT_EQ(errorOf({"synth", "--scenario", "tap", "-o", "-"}),
              "zorvatouch: --scenario: 'tap' is not a scenario; did you mean 'taps'?" + hint);
    EXPECT_EQ(errorOf({"synth", "--scenario", "night", "-o", "-"}),
              "zorvatouch: --scenario: 'night' is not a scenario; --list shows them" + hint);
    EXPECT_EQ(errorOf({"synth", "--noise", "-1", "-o", "-"}),
              "zorvatouch: --noise: '-1' must be a number from 0 to 10000 (counts)" + hint);
    EXPECT_EQ(errorOf({"synth", "--finger-width", "nan", "-o", "-"}),
              "zorvatouch: --finger-width: 'nan' must be a number from 0.5 to 100 (mm)" + hint);
    EXPECT_EQ(errorOf({"synth", "--duration", "1h", "-o", "-"}),
              "zorvatouch: --duration: '1h' must be a number from 0.1 to 36000 (s)" + hint);
    EXPECT_EQ(errorOf({"synth", "--seed", "1.5", "-o", "-"}),
              "zorvatouch: --seed: '1.5' must be an integer >= 0" + hint);
    EXPECT_THAT(errorOf({"synth", "--loudness", "3", "-o", "-"}),
                AllOf(HasSubstr("--loudness"), EndsWith(hint)));
}

TEST_F(SynthCommand, AFileThatCannotBeWrittenIsAnError) {
    EXPECT_THAT(errorOf({"synth", "--duration", "1", "-o", "@no/such.json"}),
                AllOf(StartsWith("zorvatouch: @no/such.json: cannot open"),
                      EndsWith(": No such file or directory\n")));
}

TEST_F(SynthCommand, ExtremesDoNotHurt) {
    for (const Synth::ParameterInfo &info : Synth::parameters())
        for (const double value : {info.lowest, info.highest}) {
            const std::string flag = "--" + std::string(info.name);
            const std::string text = outputOf(
                {"synth", "--scenario", "resets", "--duration", "3", flag, std::to_string(value), "-o", "-"});
            EXPECT_NO_THROW(static_cast<void>(readRecordingContainer(text))) << flag << " " << value;
        }
}

} // namespace
} // namespace ZorvaTouch::Tools

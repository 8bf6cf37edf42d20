#include "Tests/Unit/Tools/Cli/CliFixture.h"

#include <gmock/gmock.h>

namespace ZorvaTouch::Tools {
namespace {

using ReplayTableOutput = CliFixture;
using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::Not;
using ::testing::StartsWith;

// Images 1 to 8 are the frames 1 to 8 of the recording, the state write is frame 0.
//   hold       30 ms after image 1, which is longer than 20 ms: image 4
//   it moves   A falls silent and G answers: image 5
//   it ends    image 7, 60 ms after it began
//   touch      of L, image 8 at 70 ms; the reset 10 ms later withdraws it, as the device's clock is back at 0
constexpr const char *kGestures = "state Algs.HoldTimeoutMilliseconds 20\n"
                                  "touch A=300 for 40ms\n"
                                  "touch G=300 for 20ms\n"
                                  "idle\n"
                                  "touch L=300\n"
                                  "reset\n"
                                  "firmware 5\n"
                                  "raw 09\n";

TEST_F(ReplayTableOutput, HasALineForEachGesture) {
    makeRecording("all.json", kGestures);
    EXPECT_EQ(outputOf({"replay", "@all.json"}),
              "@all.json\n"
              "      time s  gesture          region                           ms    frame        n\n"
              "       0.030  hold             play/pause                       30        4        4\n"
              "       0.040  hold moves       play/pause → volume up           40        5        5\n"
              "       0.060  hold ends        volume up                        60        7        7\n"
              "       0.080  touch withdrawn                                   10                 9\n"
              "       0.080  device reset                                                         9\n"
              "  events        may-begin 2, hold-start 1, hold-change 1, hold-end 1, cancel 1,\n"
              "                reset 1\n"
              "  recognized    holds begun 1, holds begun play/pause 1, holds ended 1,\n"
              "                frames of holds 2, frames of holds volume up 2\n"
              "  rejected      taps 1, taps volume down 1\n"
              "  device        resets 1\n");
}

TEST_F(ReplayTableOutput, SaysThatThereAreNoGestures) {
    makeRecording("idle.json", "number 7\nidle\nnumber 7\nidle");
    EXPECT_EQ(outputOf({"replay", "@idle.json"}), "@idle.json\n"
                                                  "  no gestures\n"
                                                  "  events        none\n"
                                                  "  device        gaps in the images 1\n");
}

TEST_F(ReplayTableOutput, ATouchThatDoesNotEndIsNoGestureYet) {
    makeRecording("touch.json", "touch A=300");
    EXPECT_THAT(outputOf({"replay", "@touch.json"}),
                HasSubstr("  no gestures\n  events        may-begin 1\n"));
}

TEST_F(ReplayTableOutput, MeasuresTouchesOnTheSensorsClock) {
    // The clock wraps during the touch: 4294967290, then 4 ms. Time stamps are relative to the first frame's.
    makeRecording("wrap.json", "clock 4294967290ms\nidle for 0010ms\ntouch A=300 for 20ms\nidle");
    EXPECT_THAT(
        outputOf({"replay", "@wrap.json"}),
        HasSubstr("       0.030  tap              play/pause                       20        4        3\n"));
}

TEST_F(ReplayTableOutput, ShowsTimesBeforeTheFirstFrameAsNegative) {
    writeFile("unsorted.json",
              R"({"Version":2,"Frames":[)"
              R"({"Type":"InputReport","Timestamp":2500000000,"Data":"02 00 00 00 00 00 00 00 00 00 "},)"
              R"({"Type":"InputReport","Timestamp":1000000000,"Data":"02 00 00 00 00 00 00 00 00 00 "}]})");
    EXPECT_THAT(
        outputOf({"replay", "@unsorted.json"}),
        HasSubstr("       0.000  device reset                                                         0\n"
                  "      -1.500  device reset                                                         1\n"));
}

TEST_F(ReplayTableOutput, DescribesFramesWithGesturesWhenAsked) {
    makeRecording("tap.json", "touch A=300 for 30ms\nidle for 20ms\n");
    const std::string output = outputOf({"replay", "--describe", "@tap.json"});
    EXPECT_THAT(output, HasSubstr("        4        3\n"
                                  "              ts=0.000000, sd=18.69"));
    EXPECT_THAT(output, HasSubstr("] TAP 30ms ActiveRegion=1 BELOWNOISE\n"
                                  "              ts=0.000000, sd=18.69"));
    EXPECT_THAT(output, HasSubstr(" [ABE=   0, ABF=   0, "));
    EXPECT_THAT(output, Not(HasSubstr("STARTTOUCH"))); // a may-begin is no gesture line
}

TEST_F(ReplayTableOutput, EndsSeveralRecordingsWithATotal) {
    makeRecording("tap.json", "touch A=300 for 30ms\nidle for 20ms\n");
    makeRecording("reset.json", "reset");
    const std::string output = outputOf({"replay", "@tap.json", "@reset.json", "@tap.json"});
    EXPECT_THAT(output, StartsWith("@tap.json\n"));
    EXPECT_THAT(output, HasSubstr("\n\n@reset.json\n"));
    EXPECT_THAT(output, EndsWith("\n\n3 recordings: may-begin 2, tap 2, reset 1\n"));
}

TEST_F(ReplayTableOutput, EachRecordingHasAFreshPipeline) {
    // After the first recording's hold time-out of 20 ms, 30 ms would be a hold.
    makeRecording("short.json", "state Algs.HoldTimeoutMilliseconds 20\nidle");
    makeRecording("touch.json", "touch A=300 for 40ms\nidle");
    EXPECT_THAT(outputOf({"replay", "@short.json", "@touch.json"}),
                EndsWith("\n2 recordings: may-begin 1, tap 1\n"));
}

TEST_F(ReplayTableOutput, IsColouredOnATerminalOnly) {
    makeRecording("tap.json", "touch A=300 for 30ms\nidle for 20ms\n");
    EXPECT_THAT(outputOf({"replay", "@tap.json"}), Not(HasSubstr("\x1b")));
    usesColour = true;
    const std::string output = outputOf({"replay", "@tap.json"});
    EXPECT_THAT(output, StartsWith("\x1b[1m@tap.json\x1b[0m\n\x1b[2m      time s  gesture "));
    EXPECT_THAT(output, HasSubstr("       0.030  \x1b[32mtap              \x1b[0mplay/pause  "));
}

// --- Options
// -------------------------------------------------------------------------------------------------------

TEST_F(ReplayTableOutput, TakesAStateToBeginWith) {
    makeRecording("touch.json", "touch A=300 for 40ms\nidle");
    for (const char *key : {"HoldTimeoutMilliseconds", "Algs.HoldTimeoutMilliseconds",
                            "Pipeline.HoldTimeoutMilliseconds", "Pipeline.Algs.HoldTimeoutMilliseconds"})
        EXPECT_THAT(outputOf({"replay", "--set", std::string(key) + "=20", "@touch.json"}),
                    HasSubstr("  hold  "))
            << key;
}

TEST_F(ReplayTableOutput, TheRecordingsOwnStatesWin) {
    makeRecording("touch.json", "state Algs.HoldTimeoutMilliseconds 500\ntouch A=300 for 40ms\nidle");
    EXPECT_THAT(outputOf({"replay", "@touch.json", "--set", "HoldTimeoutMilliseconds=20"}),
                HasSubstr("  tap  "));
}

TEST_F(ReplayTableOutput, OfSeveralStatesWithOneKeyTheLastWins) {
    makeRecording("touch.json", "touch A=300 for 40ms\nidle");
    EXPECT_THAT(outputOf({"replay", "--set", "HoldTimeoutMilliseconds=500", "--set",
                          "HoldTimeoutMilliseconds=20", "@touch.json"}),
                HasSubstr("  hold  "));
}

TEST_F(ReplayTableOutput, PausesAsRecordedDividedByTheSpeed) {
    makeRecording("slow.json", "idle\nidle\nwait 40ms\nidle");
    EXPECT_EQ(outputOf({"replay", "@slow.json", "--speed", "2"}), outputOf({"replay", "@slow.json"}));
    EXPECT_THAT(clock.pausesUs(),
                ::testing::ElementsAre(5'000, 25'000)); // 10 and 50 ms; none without --speed
}

TEST_F(ReplayTableOutput, LogsFromTheLevelThatWasAskedFor) {
    makeRecording("idle.json", "idle");
    static_cast<void>(outputOf({"replay", "@idle.json"}));
    EXPECT_EQ(logLevel, Ports::LogLevel::Error);
    logs.enable(Ports::LogLevel::Debug);
    static_cast<void>(outputOf({"replay", "--log-level", "debug", "@idle.json"}));
    EXPECT_EQ(logLevel, Ports::LogLevel::Debug);
    EXPECT_EQ(logs.switches->records.size(), 3u); // counters and two descriptions for one frame
    static_cast<void>(outputOf({"replay", "--log-level", "default", "@idle.json"}));
    EXPECT_EQ(logLevel, Ports::LogLevel::Default);
}

TEST_F(ReplayTableOutput, ReadsStandardInput) {
    makeRecording("tap.json", "touch A=300 for 30ms\nidle for 20ms\n");
    input = readFile("tap.json");
    const std::string output = outputOf({"replay", "-"});
    EXPECT_THAT(output, StartsWith("standard input\n"));
    EXPECT_THAT(output, HasSubstr("  tap  "));
}

} // namespace
} // namespace ZorvaTouch::Tools

#include "Tests/Unit/Tools/Cli/CliFixture.h"

#include <gmock/gmock.h>

namespace ZorvaTouch::Tools {
namespace {

using ReplayJsonLines = CliFixture;
using ::testing::HasSubstr;

const std::string kNoDispatched =
    R"("Dispatched":{"numBeginHold":0,"numEndHold":0,"numHolding2Suppressed":0,"numIncrementHold":0,"numKeloCall":0,)"
    R"("numKeloCallIncrement":0,"numPlayPause":0,"numTaps":0,"numVolumeDecrement":0,"numVolumeDown":0,)"
    R"("numVolumeIncrement":0,"numVolumeUp":0})";
const std::string kNoRejected =
    R"("Rejected":{"numRejectedBeginHold":0,"numRejectedEndHold":0,"numRejectedIncrementHold":0,)"
    R"("numRejectedKeloCall":0,"numRejectedKeloCallIncrement":0,"numRejectedPlayPause":0,"numRejectedTap":0,)"
    R"("numRejectedVolumeDecrement":0,"numRejectedVolumeDown":0,"numRejectedVolumeIncrement":0,)"
    R"("numRejectedVolumeUp":0,"numSuppressed2Holding":0})";

std::string endLine(const std::string &dispatched, const std::string &rejected, int resets, int disjoint) {
    return R"({"type":"end","EventStats":{)" + dispatched + "," + rejected + R"(},"ResetCount":)" +
           std::to_string(resets) + R"(,"DisjointImageCount":)" + std::to_string(disjoint) + "}\n";
}

TEST_F(ReplayJsonLines, OfATap) {
    // A's 300 * 1.9219 = 576 are touched at once. The release is a tap: the touch lasted as long as the
    // contact.
    makeRecording("tap.json", "touch A=300 for 30ms\nidle for 20ms\n");
    const std::string dispatched =
        R"("Dispatched":{"numBeginHold":0,"numEndHold":0,"numHolding2Suppressed":0,"numIncrementHold":0,)"
        R"("numKeloCall":0,"numKeloCallIncrement":0,"numPlayPause":1,"numTaps":1,"numVolumeDecrement":0,)"
        R"("numVolumeDown":0,"numVolumeIncrement":0,"numVolumeUp":0})";
    EXPECT_EQ(
        outputOf({"replay", "--json", "@tap.json"}),
        R"({"type":"image","n":0,"frameNumber":1,"timeMs":0,"events":[{"mask":0,"phase":128,"y":1,"frame":1}]})"
        "\n"
        R"({"type":"image","n":1,"frameNumber":2,"timeMs":10,"events":[]})"
        "\n"
        R"({"type":"image","n":2,"frameNumber":3,"timeMs":20,"events":[]})"
        "\n"
        R"({"type":"image","n":3,"frameNumber":4,"timeMs":30,"events":)"
        R"([{"mask":131072,"phase":null,"y":1,"frame":4}]})"
        "\n"
        R"({"type":"image","n":4,"frameNumber":5,"timeMs":40,"events":[]})"
        "\n" +
            endLine(dispatched, kNoRejected, 0, 0));
}

TEST_F(ReplayJsonLines, OfEveryKindOfReport) {
    makeRecording("all.json", "meta a 1\nidle\nstate b 2\nreset\nfirmware 3\nraw 07\nraw\nnumber 9\nidle");
    EXPECT_EQ(outputOf({"replay", "@all.json", "--json"}),
              R"({"type":"image","n":1,"frameNumber":1,"timeMs":0,"events":[]})"
              "\n"
              R"({"type":"reset","n":3,"events":[{"vendor":true,"usagePage":65376,"usage":2}]})"
              "\n"
              R"({"type":"firmware","n":4,"eventCode":3})"
              "\n"
              R"({"type":"unhandled","n":5})"
              "\n"
              R"({"type":"unhandled","n":6})"
              "\n"
              R"({"type":"image","n":7,"frameNumber":9,"timeMs":10,"events":[]})"
              "\n" +
                  endLine(kNoDispatched, kNoRejected, 1, 1));
}

TEST_F(ReplayJsonLines, OfATouchThatAResetWithdraws) {
    makeRecording("reset.json", "touch L=300\nreset");
    // The all-zero frame has time 0: the touch ends when it began, which no tap does.
    EXPECT_THAT(outputOf({"replay", "--json", "@reset.json"}),
                HasSubstr(R"({"type":"reset","n":1,"events":[{"mask":0,"phase":8,"y":0,"frame":0},)"
                          R"({"vendor":true,"usagePage":65376,"usage":2}]})"
                          "\n"));
}

TEST_F(ReplayJsonLines, DescribeImagesWhenAsked) {
    makeRecording("idle.json", "idle\nreset");
    const std::string head = "ts=0.000000, sd=0.000000, tsd=0.000000, NonActivePixels=21, "
                             "TimeDurationRatio=0.000000, TapSVMScore=1.549000, ";
    EXPECT_THAT(
        outputOf({"replay", "--json", "--describe", "@idle.json"}),
        ::testing::StartsWith(
            R"({"type":"image","n":0,"frameNumber":1,"timeMs":0,"events":[],"touch":")" + head +
            "[A=   0    0, B=   0    0, C=   0    0, D=   0    0, E=   0    0, F=   0    0, G=   0    0, "
            "H=   0    0, I=   0    0, J=   0    0, K=   0    0, L=   0    0, M=   0    0, N=   0    0, "
            R"(O=   0    0] ","virtual":")" +
            head +
            "[ABE=   0, ABF=   0, ADEF=   0, AEGJ=   0, BCEF=   0, BFHJ=   0, CDE=   0, CDF=   0, CELN=   0, "
            "DFLO=   0, EFK=   0, EJK=   0, EKL=   0, FJK=   0, FKL=   0, GHI=   0, GIJ=   0, HIJ=   0, "
            "IJK=   0, KLM=   0, LMN=   0, LMO=   0, MNO=   0] \"}\n"
            R"({"type":"reset","n":1,"events":[)"));
}

TEST_F(ReplayJsonLines, EndEachRecordingWithItsOwnCounters) {
    makeRecording("a.json", "reset");
    makeRecording("b.json", "raw 07");
    EXPECT_EQ(outputOf({"replay", "--json", "@a.json", "@b.json"}),
              R"({"type":"reset","n":0,"events":[{"vendor":true,"usagePage":65376,"usage":2}]})"
              "\n" +
                  endLine(kNoDispatched, kNoRejected, 1, 0) +
                  R"({"type":"unhandled","n":0})"
                  "\n" +
                  endLine(kNoDispatched, kNoRejected, 0, 0));
}

TEST_F(ReplayJsonLines, OfAnEmptyRecordingAreItsEnd) {
    makeRecording("empty.json", "");
    EXPECT_EQ(outputOf({"replay", "--json", "@empty.json"}), endLine(kNoDispatched, kNoRejected, 0, 0));
}

TEST_F(ReplayJsonLines, OfALongRecordingAreAllThere) {
    makeRecording("long.json", "idle for 20000 reports");
    const std::string output = outputOf({"replay", "--json", "@long.json"});
    EXPECT_EQ(std::count(output.begin(), output.end(), '\n'), 20'001);
    EXPECT_THAT(output,
                HasSubstr("\n{\"type\":\"image\",\"n\":19999,\"frameNumber\":20000,\"timeMs\":199990,"));
}

} // namespace
} // namespace ZorvaTouch::Tools

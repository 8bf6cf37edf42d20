#include "Tests/Unit/Tools/Cli/CliFixture.h"

#include <gmock/gmock.h>

namespace ZorvaTouch::Tools {
namespace {

using Info = CliFixture;
using ::testing::HasSubstr;

constexpr const char *kEverything = "meta Place \"bench\"\n"
                                    "state Algs.EnableTapSuppression false\n"
                                    "state a [1]\n"
                                    "state a [2]\n"
                                    "touch A=300 for 20ms\n" // at 0 and 10 ms
                                    "number 7\n"             // one disjoint image
                                    "idle for 20ms\n"        // at 20 and 30 ms
                                    "wait 60ms\n"
                                    "idle\n" // at 100 ms
                                    "reset\n"
                                    "firmware 4\n"
                                    "raw 07\n"; // all three at 110 ms

// Intervals, the disjoint one left out: 10, 10, 70 ms. Median 10; differences 0, 0, 60: 95 % of three are
// three.

TEST_F(Info, SaysWhatARecordingHolds) {
    makeRecording("all.json", kEverything);
    EXPECT_EQ(
        outputOf({"info", "@all.json"}),
        "@all.json\n"
        "  container   version 2\n"
        "  frames      12: images 5, resets 1, other firmware events 1, unhandled reports 1, state writes 3, "
        "metadata items 1\n"
        "  duration    0.110 s\n"
        "  rate        100.00 images/s, one each 10.000 ms, jitter 60.000 ms, longest gap 70.000 ms\n"
        "  disjoint    images 1\n"
        "  events      may-begin 1, tap 1, reset 1\n"
        "  states      Algs.EnableTapSuppression = false\n"
        "              a = [2]\n");
}

TEST_F(Info, SaysTheSameToPrograms) {
    makeRecording("all.json", kEverything);
    EXPECT_EQ(
        outputOf({"info", "--json", "@all.json"}),
        R"({"file":"@all.json","version":2,"frames":{"total":12,"image":5,"reset":1,"firmware":1,)"
        R"("unhandled":1,"state":3,"metadata":1},"durationNs":110000000,"intervals":{"ratePerSecond":100.0,)"
        R"("medianNs":10000000,"jitterNs":60000000,"longestNs":70000000},"disjoint":1,)"
        R"("events":{"may-begin":1,"hold-start":0,"hold-change":0,"hold-end":0,"tap":1,"cancel":0,"reset":1},)"
        R"("states":{"Algs.EnableTapSuppression":false,"a":[2]}})"
        "\n");
}

TEST_F(Info, OfAnEmptyRecordingHasNoRate) {
    makeRecording("empty.json", "");
    EXPECT_EQ(outputOf({"info", "@empty.json"}), "@empty.json\n"
                                                 "  container   version 2\n"
                                                 "  frames      0\n"
                                                 "  duration    0.000 s\n"
                                                 "  disjoint    images 0\n"
                                                 "  events      none\n");
    EXPECT_THAT(outputOf({"info", "--json", "@empty.json"}),
                HasSubstr(R"("durationNs":0,"intervals":null,"disjoint":0,)"));
}

TEST_F(Info, JitterLeavesOutFiveOfAHundredIntervals) {
    // 100 intervals: 95 of 10 ms and 5 of 20 ms; then 94 and 6. A report's period is the pause after it.
    makeRecording("five.json", "idle for 95 reports\nevery 20ms\nidle for 6 reports\n");
    EXPECT_THAT(outputOf({"info", "@five.json"}), HasSubstr("jitter 0.000 ms, longest gap 20.000 ms"));
    makeRecording("six.json", "idle for 94 reports\nevery 20ms\nidle for 7 reports\n");
    EXPECT_THAT(outputOf({"info", "@six.json"}), HasSubstr("jitter 10.000 ms, longest gap 20.000 ms"));
}

TEST_F(Info, ImagesOfOneTimeHaveNoRate) {
    writeFile(
        "still.json", R"({"Version":0,"Reports":[{"Timestamp":5,"ReportData":")" + [] {
            std::string image = "01 01 ";
            for (int i = 2; i < 73; ++i)
                image += "00 ";
            return image + R"("},{"Timestamp":5,"ReportData":")" + "01 02 " + image.substr(6) + R"("}]})";
        }());
    EXPECT_THAT(outputOf({"info", "@still.json"}),
                HasSubstr("  rate        one each 0.000 ms, jitter 0.000 ms, longest gap 0.000 ms\n"));
    EXPECT_THAT(outputOf({"info", "--json", "@still.json"}),
                HasSubstr(R"("intervals":{"ratePerSecond":null,"medianNs":0,"jitterNs":0,"longestNs":0})"));
}

TEST_F(Info, KnowsOlderContainers) {
    writeFile("zero.json", R"({"Version":0,"Reports":[{"Timestamp":5,"ReportData":"07 "}]})");
    writeFile("one.json", R"({"Version":1,"Frames":[]})");
    EXPECT_THAT(outputOf({"info", "@zero.json"}),
                HasSubstr("  container   version 0\n  frames      1: unhandled "));
    EXPECT_THAT(outputOf({"info", "@one.json"}), HasSubstr("  container   version 1\n  frames      0\n"));
}

TEST_F(Info, OfSeveralRecordingsComesOneAfterAnother) {
    makeRecording("a.json", "raw");
    input = readFile("a.json");
    const std::string output = outputOf({"info", "--json", "@a.json", "-"});
    EXPECT_THAT(output, ::testing::StartsWith(R"({"file":"@a.json",)"));
    EXPECT_THAT(output, HasSubstr("\n{\"file\":\"-\","));
}

} // namespace
} // namespace ZorvaTouch::Tools

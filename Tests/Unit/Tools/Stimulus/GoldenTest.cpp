#include "Tools/Stimulus/Golden.h"

#include "Tools/Stimulus/StimulusText.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace ZorvaTouch::Tools {
namespace {

using ::testing::ElementsAre;

// A touch of A is touched at once (300 * 1.9219 = 576 > 200) and a tap at its release: strong, and as long as
// the contact.
const std::string kTap = "touch A=300 for 30ms\nidle for 20ms\n";

TEST(Golden, FindsNoDifferenceWhenAllIsAsExpected) {
    EXPECT_EQ(compareGolden(kTap + "\nframe 1 @0ms may-begin play/pause\nframe 4 @30ms tap play/pause\n"),
              "");
}

TEST(Golden, BlanksAndCommentsMakeNoDifference) {
    EXPECT_EQ(compareGolden(kTap + "\n\t frame  1 @0ms\tmay-begin play/pause # the touch\r\n"
                                   "\n# and its end\nframe 4 @30ms tap play/pause"),
              "");
}

TEST(Golden, ShowsWhatDiffersBetweenWhatAgrees) {
    EXPECT_EQ(compareGolden("touch A=300 for 30ms\nidle for 20ms\ntouch G=300\nidle\n"
                            "\nframe 1 @0ms may-begin play/pause\nframe 5 @40ms tap play/pause\n"
                            "frame 6 @50ms may-begin volume-up\nframe 7 @60ms cancel none\n"),
              // The second touch: the contact lasts 10 ms, the last tap was 30 ms ago, so it is a tap too.
              "  frame 1 @0ms may-begin play/pause\n"
              "- frame 5 @40ms tap play/pause\n"
              "- frame 6 @50ms may-begin volume-up\n"
              "- frame 7 @60ms cancel none\n"
              "+ frame 4 @30ms tap play/pause\n"
              "+ frame 6 @50ms may-begin volume-up\n"
              "+ frame 7 @60ms tap volume-up\n");
}

TEST(Golden, ShowsAnEventThatIsMissing) {
    EXPECT_EQ(compareGolden(kTap + "\nframe 1 @0ms may-begin play/pause\n"),
              "  frame 1 @0ms may-begin play/pause\n"
              "+ frame 4 @30ms tap play/pause\n");
}

TEST(Golden, ShowsAnEventTooMany) { EXPECT_EQ(compareGolden("idle\n\nreset\n"), "- reset\n"); }

TEST(Golden, ATextThatCannotBeReadDiffers) {
    EXPECT_EQ(compareGolden("touch P=1"), "line 1: unknown electrode 'P'");
}

TEST(Golden, AResetEndsATouchAtFrameZeroAndTimeZero) {
    EXPECT_EQ(compareGolden("state Algs.HoldTimeoutMilliseconds 20\ntouch A=300 for 40ms\nreset\n"
                            "\nframe 1 @0ms may-begin play/pause\nframe 4 @30ms hold-start play/pause\n"
                            "frame 0 @0ms hold-end play/pause\nreset\n"),
              "");
}

TEST(Golden, AHoldMovesBetweenRegions) {
    // 30 ms are longer than 20 ms. When an electrode falls silent while another one answers, the hold moves
    // at once.
    EXPECT_EQ(compareGolden("state Algs.HoldTimeoutMilliseconds 20\n"
                            "touch A=300 for 40ms\ntouch G=300\ntouch L=300\nidle\n"
                            "\nframe 1 @0ms may-begin play/pause\nframe 4 @30ms hold-start play/pause\n"
                            "frame 5 @40ms hold-change volume-up\nframe 6 @50ms hold-change volume-down\n"
                            "frame 7 @60ms hold-end volume-down\n"),
              "");
}

// --- Descriptions
// --------------------------------------------------------------------------------------------------

const std::string kSilence =
    "[A=   0    0, B=   0    0, C=   0    0, D=   0    0, E=   0    0, F=   0    0, G=   0    0, "
    "H=   0    0, I=   0    0, J=   0    0, K=   0    0, L=   0    0, M=   0    0, N=   0    0, "
    "O=   0    0]";
const std::string kVirtualSilence = "[ABE=   0, ABF=   0, ADEF=   0, AEGJ=   0, BCEF=   0, BFHJ=   0, CDE=   "
                                    "0, CDF=   0, CELN=   0, DFLO=   0, "
                                    "EFK=   0, EJK=   0, EKL=   0, FJK=   0, FKL=   0, GHI=   0, GIJ=   0, "
                                    "HIJ=   0, IJK=   0, KLM=   0, LMN=   0, "
                                    "LMO=   0, MNO=   0]";
// Nothing has happened: 21 - 0 inactive channels, 0.1886 * 21 - 2.4116 = 1.549.
const std::string kIdleHead = "ts=0.000000, sd=0.000000, tsd=0.000000, NonActivePixels=21, "
                              "TimeDurationRatio=0.000000, TapSVMScore=1.549000, ";

TEST(Golden, ComparesTheDescriptionsOfTheFramesThatAreListed) {
    EXPECT_EQ(compareGolden("idle for 30ms\n\ntouch 2: " + kIdleHead + kSilence +
                            "\nvirtual 3: " + kIdleHead + kVirtualSilence + " \n"),
              "");
}

TEST(Golden, ShowsADescriptionThatDiffers) {
    EXPECT_EQ(compareGolden("idle\n\ntouch 1: ts=1\n"),
              "- touch 1: ts=1\n+ touch 1: " + kIdleHead + kSilence + "\n");
}

TEST(Golden, ShowsADescriptionOfAFrameThatThereIsNot) {
    EXPECT_EQ(compareGolden("idle\n\nvirtual 2: ts=1\n"), "- virtual 2: ts=1\n");
}

TEST(Golden, ADescriptionFollowsItsFramesEvents) {
    const Stimulus stimulus = parseStimulus(kTap + "\nvirtual 4: x\ntouch 4: x\n");
    const std::vector<std::string> lines = replayLines(stimulus.frames, stimulus.expected);
    EXPECT_THAT(lines,
                ElementsAre("frame 1 @0ms may-begin play/pause", "frame 4 @30ms tap play/pause",
                            ::testing::StartsWith("touch 4: ts="), ::testing::StartsWith("virtual 4: ts=")));
}

} // namespace
} // namespace ZorvaTouch::Tools

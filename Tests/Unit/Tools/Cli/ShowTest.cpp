#include "Tests/Unit/Tools/Cli/CliFixture.h"

#include <gmock/gmock.h>

namespace ZorvaTouch::Tools {
namespace {

using ::testing::StartsWith;

class Show : public CliFixture {
protected:
    void SetUp() override {
        CliFixture::SetUp();
        makeRecording("all.json", "meta a 1\n"         // frame 0
                                  "state b 2\n"        // 1
                                  "idle\n"             // 2, image 1
                                  "counts M=77\n"      //
                                  "touch A=9 M=-500\n" // 3, image 2
                                  "touch M=9\n"        // 4, image 3
                                  "reset\n"            // 5
                                  "raw 07\n");         // 6
    }
};

TEST_F(Show, DrawsTheImageOfAnIndex) {
    EXPECT_EQ(outputOf({"show", "@all.json", "--frame", "4"}), "# Image frame 3    time 20 ms\n"
                                                               "\n"
                                                               "            0        0            \n"
                                                               "                 0                 \n"
                                                               "      0                    0      \n"
                                                               "          0            0          \n"
                                                               "      0                    0      \n"
                                                               "  0                            0  \n"
                                                               "                 0                 \n"
                                                               "  0                            0  \n"
                                                               "      0                    0      \n"
                                                               "          0            0          \n"
                                                               "      0                    0      \n"
                                                               "                 9                 \n"
                                                               "            0        0            \n");
}

TEST_F(Show, DrawsRawCountsWhenAsked) {
    const std::string output = outputOf({"show", "--raw", "@all.json", "--frame", "3"});
    EXPECT_THAT(output, StartsWith("# Image frame 2    time 10 ms\n"));
    EXPECT_THAT(output, ::testing::HasSubstr("\n                77"));
}

TEST_F(Show, DrawsTheFirstImageWithTheLargestSignal) {
    // Images 2 and 3 both reach 9; -500 is not large.
    EXPECT_THAT(outputOf({"show", "@all.json"}), StartsWith("# Image frame 2 "));
}

TEST_F(Show, ImagesWithoutAnySignalWillDo) {
    makeRecording("idle.json",
                  "touch A=-5 B=-5 C=-5 D=-5 E=-5 F=-5 G=-5 H=-5 I=-5 J=-5 K=-5 L=-5 M=-5 N=-5 O=-5\n");
    EXPECT_THAT(outputOf({"show", "@idle.json"}), StartsWith("# Image frame 1 "));
}

TEST_F(Show, SaysWhatAFrameIsThatIsNoImage) {
    EXPECT_EQ(errorOf({"show", "@all.json", "--frame", "0"}),
              "zorvatouch: @all.json: frame 0: it is no image but a metadata item\n");
    EXPECT_EQ(errorOf({"show", "@all.json", "--frame", "1"}),
              "zorvatouch: @all.json: frame 1: it is no image but a state write\n");
    EXPECT_EQ(errorOf({"show", "@all.json", "--frame", "5"}),
              "zorvatouch: @all.json: frame 5: it is no image but a firmware event\n");
    EXPECT_EQ(errorOf({"show", "@all.json", "--frame", "6"}),
              "zorvatouch: @all.json: frame 6: it is no image but an unhandled report\n");
    EXPECT_EQ(errorOf({"show", "@all.json", "--frame", "7"}),
              "zorvatouch: @all.json: frame 7: there is none; the recording has 7 frames\n");
    EXPECT_EQ(
        errorOf({"show", "@all.json", "--frame", "18446744073709551615"}),
        "zorvatouch: @all.json: frame 18446744073709551615: there is none; the recording has 7 frames\n");
}

TEST_F(Show, SaysThatThereIsNoImage) {
    makeRecording("none.json", "reset\nraw");
    EXPECT_EQ(errorOf({"show", "@none.json"}), "zorvatouch: @none.json: there is no image\n");
}

} // namespace
} // namespace ZorvaTouch::Tools

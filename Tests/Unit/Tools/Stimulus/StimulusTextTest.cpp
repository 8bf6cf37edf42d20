#include "Tools/Stimulus/StimulusText.h"

#include "Shared/InputReport.h"
#include "Tests/Support/RecordingFakes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using InputReport::Image;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

std::vector<Frame> framesOf(const std::string &text) {
    return Scripted::framesOf(parseStimulus(text).frames);
}

Image imageOf(const Frame &frame) {
    const auto image = Image::parse(frame.data.data(), frame.data.size());
    EXPECT_TRUE(image.has_value());
    return image.value_or(Image{});
}

/// One image in short: "number @time" and the signal of electrode A.
std::string inShort(const Frame &frame) {
    const Image image = imageOf(frame);
    return std::to_string(image.frameNumber) + " @" + std::to_string(image.timeMs) +
           " A=" + std::to_string(image.signals[0]);
}

std::vector<std::string> imagesOf(const std::string &text) {
    std::vector<std::string> images;
    for (const Frame &frame : framesOf(text))
        images.push_back(inShort(frame));
    return images;
}

/// Time stamps after the first frame's possible one, in ms.
std::vector<std::uint64_t> offsetsMsOf(const std::string &text) {
    std::vector<std::uint64_t> offsets;
    for (const Frame &frame : framesOf(text))
        offsets.push_back((frame.timestampNs - 1'000'000'000) / 1'000'000);
    return offsets;
}

// --- Reports
// -------------------------------------------------------------------------------------------------------

TEST(StimulusText, AnEmptyTextHasNoFramesAndExpectsNothing) {
    const Stimulus stimulus = parseStimulus("");
    EXPECT_EQ(stimulus.frames.size(), 0u);
    EXPECT_THAT(stimulus.expected, IsEmpty());
}

TEST(StimulusText, ATouchWithoutALengthIsOneReport) {
    EXPECT_THAT(imagesOf("touch A=300"), ElementsAre("1 @0 A=300"));
}

TEST(StimulusText, ATouchIsAWholeImageReport) {
    const std::vector<Frame> frames =
        framesOf("number 258\nclock 772ms\ncounts A=1 O=65535\ntouch A=-2 B=513 O=32767");
    ASSERT_THAT(frames, SizeIs(1));
    std::vector<std::uint8_t> expected(73, 0);
    expected[0] = 1;                                            // report ID
    expected[1] = 2, expected[2] = 1;                           // 258 = 0x0102
    expected[5] = 4, expected[6] = 3;                           // 772 = 0x0304
    expected[13] = 1, expected[41] = 0xFF, expected[42] = 0xFF; // raw counts of A and O
    expected[43] = 0xFE, expected[44] = 0xFF;                   // -2
    expected[45] = 1, expected[46] = 2;                         // 513 = 0x0201
    expected[71] = 0xFF, expected[72] = 0x7F;                   // 32767
    EXPECT_EQ(frames[0], (Frame{FrameType::InputReport, 1'000'000'000, "", {}, expected}));
}

TEST(StimulusText, ATouchLastsForATime) {
    EXPECT_THAT(imagesOf("touch A=300 for 30ms"), ElementsAre("1 @0 A=300", "2 @10 A=300", "3 @20 A=300"));
}

TEST(StimulusText, ATouchLastsForANumberOfReports) {
    EXPECT_THAT(imagesOf("touch A=300 for 2 reports"), ElementsAre("1 @0 A=300", "2 @10 A=300"));
    EXPECT_THAT(imagesOf("touch A=300 for 1 report"), ElementsAre("1 @0 A=300"));
}

TEST(StimulusText, IdleReportsAreAllZero) {
    const std::vector<Frame> frames = framesOf("touch A=1 O=2\nidle for 20ms\nidle");
    ASSERT_THAT(frames, SizeIs(4));
    for (std::size_t i = 1; i < 4; ++i)
        EXPECT_THAT(imageOf(frames[i]).signals, ::testing::Each(0)) << "frame " << i;
}

TEST(StimulusText, ElectrodesThatAreNotNamedAreZeroAgain) {
    const std::vector<Frame> frames = framesOf("touch B=7\ntouch C=8");
    ASSERT_THAT(frames, SizeIs(2));
    EXPECT_EQ(imageOf(frames[1]).signals[1], 0);
    EXPECT_EQ(imageOf(frames[1]).signals[2], 8);
}

TEST(StimulusText, ARampGoesFromTheFirstReportToTheLast) {
    // 40 + 180 * i / 3
    EXPECT_THAT(imagesOf("touch A=40..220 for 4 reports"),
                ElementsAre("1 @0 A=40", "2 @10 A=100", "3 @20 A=160", "4 @30 A=220"));
}

TEST(StimulusText, ARampTruncatesTowardZero) {
    // 10 * i / 3: 3.33, 6.67; and -10 * i / 3: -3.33, -6.67
    EXPECT_THAT(imagesOf("touch A=0..10 for 4 reports"),
                ElementsAre("1 @0 A=0", "2 @10 A=3", "3 @20 A=6", "4 @30 A=10"));
    EXPECT_THAT(imagesOf("touch A=10..0 for 4 reports"),
                ElementsAre("1 @0 A=10", "2 @10 A=7", "3 @20 A=4", "4 @30 A=0"));
}

TEST(StimulusText, ARampSpansTheWholeRange) {
    // 65535 * 1 / 2 = 32767
    EXPECT_THAT(imagesOf("touch A=-32768..32767 for 3 reports"),
                ElementsAre("1 @0 A=-32768", "2 @10 A=-1", "3 @20 A=32767"));
}

TEST(StimulusText, ARampOfOneReportStaysAtItsBeginning) {
    EXPECT_THAT(imagesOf("touch A=5..9"), ElementsAre("1 @0 A=5"));
}

// --- Time
// ----------------------------------------------------------------------------------------------------------

TEST(StimulusText, ThePeriodHoldsFromItsLineOn) {
    const std::string text = "idle for 20ms\nevery 25ms\nidle for 50ms\nidle";
    EXPECT_THAT(imagesOf(text), ElementsAre("1 @0 A=0", "2 @10 A=0", "3 @20 A=0", "4 @45 A=0", "5 @70 A=0"));
    EXPECT_THAT(offsetsMsOf(text), ElementsAre(0, 10, 20, 45, 70));
}

TEST(StimulusText, AWaitAdvancesBothClocksAndSendsNothing) {
    const std::string text = "idle\nwait 500ms\nidle";
    EXPECT_THAT(imagesOf(text), ElementsAre("1 @0 A=0", "2 @510 A=0"));
    EXPECT_THAT(offsetsMsOf(text), ElementsAre(0, 510));
}

TEST(StimulusText, TheSensorClockJumpsAndTheTimeStampsDoNot) {
    const std::string text = "idle\nclock 7000ms\nidle\nidle";
    EXPECT_THAT(imagesOf(text), ElementsAre("1 @0 A=0", "2 @7000 A=0", "3 @7010 A=0"));
    EXPECT_THAT(offsetsMsOf(text), ElementsAre(0, 10, 20));
}

TEST(StimulusText, SensorClockAndFrameNumberWrap) {
    EXPECT_THAT(imagesOf("clock 4294967290ms\nnumber 4294967295\nidle for 2 reports"),
                ElementsAre("4294967295 @4294967290 A=0", "0 @4 A=0"));
}

TEST(StimulusText, OtherFramesTakeNoTime) {
    const std::string text = "idle\nstate a 1\nmeta b 2\nreset\nfirmware 3\nraw 07\nidle";
    EXPECT_THAT(offsetsMsOf(text), ElementsAre(0, 10, 10, 10, 10, 10, 10));
    EXPECT_EQ(inShort(framesOf(text)[6]), "2 @10 A=0");
}

// --- Other frames
// --------------------------------------------------------------------------------------------------

TEST(StimulusText, RawCountsHoldUntilTheyAreGivenAnew) {
    const std::vector<Frame> frames =
        framesOf("idle\ncounts A=1000 B=2\nidle\nidle\ncounts B=3\nidle\ncounts\nidle");
    ASSERT_THAT(frames, SizeIs(5));
    const std::vector<std::pair<int, int>> expected{{0, 0}, {1000, 2}, {1000, 2}, {0, 3}, {0, 0}};
    for (std::size_t i = 0; i < 5; ++i) {
        EXPECT_EQ(imageOf(frames[i]).rawCounts[0], expected[i].first) << "frame " << i;
        EXPECT_EQ(imageOf(frames[i]).rawCounts[1], expected[i].second) << "frame " << i;
    }
}

TEST(StimulusText, AStateIsAKeyAndAValueOfJson) {
    EXPECT_THAT(
        framesOf("state Algs.EnableTapSuppression false\nstate a 1.5\nstate b [1, {\"c\": null}]"),
        ElementsAre(Scripted::stateFrame(1'000'000'000, "Algs.EnableTapSuppression", false),
                    Scripted::stateFrame(1'000'000'000, "a", 1.5),
                    Scripted::stateFrame(1'000'000'000, "b",
                                         PropertyValue::Array{1u, PropertyValue::Dictionary{{"c", {}}}})));
}

TEST(StimulusText, AValueThatIsNoJsonIsAString) {
    EXPECT_THAT(framesOf("meta Place  the  bench \nmeta Quoted \"a\\n\" "),
                ElementsAre(Scripted::metadataFrame(1'000'000'000, "Place", "the  bench"),
                            Scripted::metadataFrame(1'000'000'000, "Quoted", "a\n")));
}

TEST(StimulusText, AResetIsAFirmwareEventOfCodeZero) {
    EXPECT_THAT(framesOf("reset"),
                ElementsAre(Scripted::reportFrame(1'000'000'000, {2, 0, 0, 0, 0, 0, 0, 0, 0, 0})));
}

TEST(StimulusText, AFirmwareEventHasACodeAndAPayloadOfEightBytes) {
    EXPECT_THAT(framesOf("firmware 255 01 fF\nfirmware 1 1 2 3 4 5 6 7 8"),
                ElementsAre(Scripted::reportFrame(1'000'000'000, {2, 255, 1, 255, 0, 0, 0, 0, 0, 0}),
                            Scripted::reportFrame(1'000'000'000, {2, 1, 1, 2, 3, 4, 5, 6, 7, 8})));
}

TEST(StimulusText, ARawReportIsItsBytes) {
    EXPECT_THAT(framesOf("raw 01 ff\nraw"), ElementsAre(Scripted::reportFrame(1'000'000'000, {1, 255}),
                                                        Scripted::reportFrame(1'000'000'000, {})));
}

// --- Lines
// ---------------------------------------------------------------------------------------------------------

TEST(StimulusText, CommentsStandAloneOrAfterBlanks) {
    EXPECT_THAT(imagesOf("# a comment\n  # another\ntouch A=1 # the third\n\t touch\tA=2\t#\n"),
                ElementsAre("1 @0 A=1", "2 @10 A=2"));
}

TEST(StimulusText, NumberSignsInsideWordsAndQuotesAreNoComments) {
    EXPECT_THAT(framesOf("meta a b#c # d\nmeta a \"b \\\" # c\" # d"),
                ElementsAre(Scripted::metadataFrame(1'000'000'000, "a", "b#c"),
                            Scripted::metadataFrame(1'000'000'000, "a", "b \" # c")));
}

TEST(StimulusText, LinesMayEndInCarriageReturns) {
    EXPECT_THAT(imagesOf("touch A=1 for 10ms\r\ntouch A=2\r\n"), ElementsAre("1 @0 A=1", "2 @10 A=2"));
}

TEST(StimulusText, BlankLinesAheadOfTheFirstDirectiveDoNotCount) {
    EXPECT_THAT(imagesOf("\n# A touch.\n\n \ntouch A=1"), ElementsAre("1 @0 A=1"));
}

TEST(StimulusText, TheFirstBlankLineEndsTheStimulus) {
    const Stimulus stimulus = parseStimulus("touch A=1\n \t\nframe 1 @0ms may-begin none\n\n# and\nreset\n");
    EXPECT_EQ(stimulus.frames.size(), 1u);
    ASSERT_THAT(stimulus.expected, SizeIs(2));
    EXPECT_EQ(stimulus.expected[0].line, 3u);
    EXPECT_EQ(stimulus.expected[0].text, "frame 1 @0ms may-begin none");
    EXPECT_EQ(stimulus.expected[1].line, 6u);
    EXPECT_EQ(stimulus.expected[1].text, "reset");
}

// --- Limits
// --------------------------------------------------------------------------------------------------------

TEST(StimulusText, AMillionFramesAreNotTooMany) {
    EXPECT_EQ(parseStimulus("idle for 999999 reports\nreset").frames.size(), 1'000'000u);
}

TEST(StimulusText, TheLongestPeriodAndTheLongestWaitAddUp) {
    const auto frames = framesOf("every 1000000ms\nidle\nwait 4294967295ms\nidle");
    EXPECT_EQ(frames[1].timestampNs - frames[0].timestampNs, 4'295'967'295'000'000u);
}

} // namespace
} // namespace ZorvaTouch::Tools

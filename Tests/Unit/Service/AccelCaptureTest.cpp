#include "Service/AccelCapture.h"

#include "Tests/Support/RecordingFakes.h"

#include <gtest/gtest.h>

#include <cstdint>

namespace ZorvaTouch {
namespace {

using Dictionary = PropertyValue::Dictionary;

class AccelCaptureOf : public ::testing::Test {
protected:
    /// Samples with these times, one after the other; X is the time.
    void samples(std::uint64_t first, std::uint64_t last) {
        for (std::uint64_t time = first; time <= last; ++time)
            capture.handleSample({time, static_cast<float>(time), 0.25f, -1.0f}, recording);
    }
    std::vector<std::uint64_t> takeTimes() {
        const auto times = recording.timestamps();
        recording.calls.clear();
        return times;
    }
    static std::vector<std::uint64_t> counted(std::uint64_t first, std::uint64_t last) {
        std::vector<std::uint64_t> numbers;
        for (std::uint64_t number = first; number <= last; ++number)
            numbers.push_back(number);
        return numbers;
    }

    AccelCapture capture;
    Scripted::CapturingInput recording;
};

TEST_F(AccelCaptureOf, NothingButSamplesKeepsTheLatestHundred) {
    samples(1, 250);
    EXPECT_TRUE(recording.calls.empty());
    ASSERT_EQ(capture.samples.size(), 100u);
    EXPECT_EQ(capture.samples.front().timestampMach, 151u);
    EXPECT_EQ(capture.samples.back().timestampMach, 250u);
}

TEST_F(AccelCaptureOf, AGestureFlushesWithTheNextSample) {
    samples(1, 150);
    capture.requestSamples();
    EXPECT_TRUE(recording.calls.empty());
    samples(151, 151);
    EXPECT_EQ(takeTimes(), counted(51, 151)); // 101
    EXPECT_TRUE(capture.samples.empty());
    EXPECT_EQ(capture.samplesNeededCount, 99u);
}

TEST_F(AccelCaptureOf, AGesturePassesAHundredOnAndThenKeepsAgain) {
    capture.requestSamples();
    samples(1, 103);
    EXPECT_EQ(takeTimes(), counted(1, 100));
    EXPECT_EQ(capture.samples.size(), 3u);
}

TEST_F(AccelCaptureOf, AnotherGestureStartsTheCountAfresh) {
    capture.requestSamples();
    samples(1, 60);
    capture.requestSamples();
    capture.requestSamples(); // set, not added
    EXPECT_EQ(capture.samplesNeededCount, 100u);
    samples(61, 170);
    EXPECT_EQ(takeTimes(), counted(1, 160));
}

TEST_F(AccelCaptureOf, ASampleIsMetadataNamedAccel) {
    capture.requestSamples();
    capture.handleSample({9, 0.5f, 0.1f, -1.0f}, recording);
    ASSERT_EQ(recording.calls.size(), 1u);
    EXPECT_EQ(recording.calls[0].type, FrameType::Metadata);
    EXPECT_EQ(recording.calls[0].timestamp, 9u);
    EXPECT_EQ(recording.calls[0].key, "Accel");
    EXPECT_EQ(recording.calls[0].value,
              PropertyValue(Dictionary{{"X", 0.5}, {"Y", static_cast<double>(0.1f)}, {"Z", -1.0}}));
}

} // namespace
} // namespace ZorvaTouch

#include "Shared/PipelineRecording.h"

#include "Shared/Pipeline.h"
#include "Tests/Support/FramesScript.h"
#include "Tests/Support/RecordingFakes.h"

#include <gtest/gtest.h>

#include <stdexcept>

namespace ZorvaTouch {
namespace {

using Scripted::framesFromShortHand;
using Scripted::framesOf;
using Scripted::metadataFrame;
using Scripted::reportFrame;
using Scripted::shortHand;
using Scripted::stateFrame;
using Bytes = std::vector<std::uint8_t>;
using Call = Scripted::CapturingInput::Call;

/// A recording in front of something that writes its calls down.
class PipelineRecordingTest : public ::testing::Test {
protected:
    PipelineRecordingTest() { recording.pipeline = input; }

    void report(std::uint64_t timestamp, const Bytes &bytes) {
        recording.handleInputReport(timestamp, bytes.data(), bytes.size());
    }

    void append(std::string_view frames) {
        for (Frame &frame : framesFromShortHand(frames))
            recording.appendFrame(std::move(frame));
    }

    Scripted::FakeClock clock;
    std::shared_ptr<Scripted::CapturingInput> input = std::make_shared<Scripted::CapturingInput>();
    PipelineRecording recording{clock};
};

// --- Capture -------------------------------------------------------------------------------------

TEST_F(PipelineRecordingTest, IsEmptyAndUnboundedAtFirst) {
    const PipelineRecording fresh(clock);
    EXPECT_TRUE(fresh.frames().empty());
    EXPECT_EQ(fresh.maxFrameCount(), 0u);
    EXPECT_EQ(fresh.pipeline, nullptr);
    EXPECT_FALSE(fresh.playCanContinue());
}

TEST_F(PipelineRecordingTest, CapturesEveryCallAndPassesItOnUnchanged) {
    recording.setState(10, "Algs.ActivationThreshold", 250.5);
    report(20, {1, 0, 255});
    recording.handleMetadata(30, "Accel", PropertyValue::Array{1u, -2.0});
    EXPECT_EQ(
        framesOf(recording.frames()),
        (std::vector<Frame>{stateFrame(10, "Algs.ActivationThreshold", 250.5), reportFrame(20, {1, 0, 255}),
                            metadataFrame(30, "Accel", PropertyValue::Array{1u, -2.0})}));
    EXPECT_EQ(input->calls,
              (std::vector<Call>{{FrameType::State, 10, "Algs.ActivationThreshold", 250.5, {}},
                                 {FrameType::InputReport, 20, "", {}, {1, 0, 255}},
                                 {FrameType::Metadata, 30, "Accel", PropertyValue::Array{1u, -2.0}, {}}}));
}

TEST(PipelineRecording, KeepsNanosecondsAndPassesTicksOn) {
    // 125 / 3 ns per tick: 24 ticks are 1000 ns, 25 are 1041.6.
    Scripted::FakeClock clock;
    clock.base = {125, 3};
    const auto input = std::make_shared<Scripted::CapturingInput>();
    PipelineRecording recording(clock);
    recording.pipeline = input;
    recording.setState(24, "a", true);
    recording.handleInputReport(25, nullptr, 0);
    recording.handleMetadata(27, "m", true);
    std::vector<std::uint64_t> times;
    for (const FrameView frame : recording.frames())
        times.push_back(frame.timestampNs);
    EXPECT_EQ(times, (std::vector<std::uint64_t>{1000, 1041, 1125}));
    EXPECT_EQ(input->timestamps(), (std::vector<std::uint64_t>{24, 25, 27}));
}

TEST(PipelineRecording, ATimeBaseOfNothingRecordsTimeZero) {
    Scripted::FakeClock clock;
    clock.base = {125, 0};
    PipelineRecording recording(clock);
    recording.setState(24, "a", true);
    EXPECT_EQ(recording.frames()[0].timestampNs, 0u);
}

TEST_F(PipelineRecordingTest, RecordsWithoutAPipeline) {
    recording.pipeline = nullptr;
    recording.setState(1, "a", 1u);
    report(2, {2});
    recording.handleMetadata(3, "m", 3u);
    EXPECT_EQ(shortHand(recording.frames()), "a=1 R2 M3");
}

TEST_F(PipelineRecordingTest, RecordsEmptyAndLongReports) {
    const Bytes longReport = Scripted::patternedReport(70000, 3);
    recording.handleInputReport(1, nullptr, 0);
    report(2, longReport);
    EXPECT_EQ(framesOf(recording.frames()),
              (std::vector<Frame>{reportFrame(1, {}), reportFrame(2, longReport)}));
    EXPECT_EQ(input->calls.at(1).data, longReport);
}

TEST_F(PipelineRecordingTest, RecordsBeforeItPassesOn) {
    std::vector<std::size_t> sizes;
    input->beforeNote = [&] { sizes.push_back(recording.frames().size()); };
    recording.setState(1, "a", 1u);
    report(2, {2});
    recording.handleMetadata(3, "m", 3u);
    EXPECT_EQ(sizes, (std::vector<std::size_t>{1, 2, 3}));
}

TEST_F(PipelineRecordingTest, RecordsWhatThePipelineFailsOn) {
    input->beforeNote = [] { throw std::runtime_error("out of order"); };
    EXPECT_THROW(recording.setState(1, "a", 1u), std::runtime_error);
    EXPECT_THROW(report(2, {2}), std::runtime_error);
    EXPECT_THROW(recording.handleMetadata(3, "m", 3u), std::runtime_error);
    EXPECT_EQ(shortHand(recording.frames()), "a=1 R2 M3");
}

// --- The bound -----------------------------------------------------------------------------------

TEST_F(PipelineRecordingTest, WithoutABoundNothingIsTrimmed) {
    for (std::uint64_t i = 0; i < 10000; ++i)
        recording.setState(i, "a", i);
    EXPECT_EQ(recording.frames().size(), 10000u);
    recording.setMaxFrameCount(0);
    EXPECT_EQ(recording.frames().size(), 10000u);
    (void)recording.json();
    EXPECT_EQ(recording.frames().size(), 10000u);
}

TEST_F(PipelineRecordingTest, TrimsAtTwiceTheBound) {
    recording.setMaxFrameCount(4);
    append("R1 R2 R3 R4 R5 R6 R7");
    EXPECT_EQ(shortHand(recording.frames()), "R1 R2 R3 R4 R5 R6 R7");
    append("R8");
    EXPECT_EQ(shortHand(recording.frames()), "R5 R6 R7 R8");
    append("R9 R10 R11");
    EXPECT_EQ(recording.frames().size(), 7u);
    append("R12");
    EXPECT_EQ(shortHand(recording.frames()), "R9 R10 R11 R12");
}

TEST_F(PipelineRecordingTest, StatesCountTowardsTwiceTheBoundButAreNotCutByIt) {
    recording.setMaxFrameCount(3);
    append("a=1 R1 a=2 b=1 R2");
    EXPECT_EQ(recording.frames().size(), 5u);
    append("a=3");
    EXPECT_EQ(shortHand(recording.frames()), "a=1 R1 a=2 b=1 R2 a=3") << "six frames, all of which matter";
    append("R3 R4");
    EXPECT_EQ(shortHand(recording.frames()), "a=2 b=1 R2 a=3 R3 R4");
}

TEST_F(PipelineRecordingTest, ABoundOfOneKeepsOneReport) {
    recording.setMaxFrameCount(1);
    append("R1");
    EXPECT_EQ(shortHand(recording.frames()), "R1");
    append("R2");
    EXPECT_EQ(shortHand(recording.frames()), "R2");
    append("a=1 R3");
    EXPECT_EQ(shortHand(recording.frames()), "a=1 R3");
}

TEST_F(PipelineRecordingTest, TheServicesBoundTrimsAtFrame8700) {
    recording.pipeline = nullptr;
    recording.setMaxFrameCount(4350);
    recording.setState(0, "a", 1u);
    for (std::uint64_t i = 1; i < 8699; ++i)
        report(i, {1});
    EXPECT_EQ(recording.frames().size(), 8699u);
    report(8699, {1});
    ASSERT_EQ(recording.frames().size(), 4351u) << "4350 reports and the state";
    EXPECT_EQ(recording.frames()[0].toFrame(), stateFrame(0, "a", 1u));
    EXPECT_EQ(recording.frames()[1].timestampNs, 4350u);
    EXPECT_EQ(recording.frames()[4350].timestampNs, 8699u);
}

TEST_F(PipelineRecordingTest, SettingTheBoundTrimsAtOnce) {
    append("R1 R2 R3 R4 R5 R6 R7 R8 R9 R10");
    recording.setMaxFrameCount(3);
    EXPECT_EQ(shortHand(recording.frames()), "R8 R9 R10");
    EXPECT_EQ(recording.maxFrameCount(), 3u);
}

TEST_F(PipelineRecordingTest, AnEnormousBoundTrimsNothing) {
    for (const std::uint64_t bound : {18446744073709551615u, 9223372036854775808u, 9223372036854775809u}) {
        PipelineRecording fresh(clock);
        fresh.setMaxFrameCount(bound); // twice the bound wraps to -2, 0 and 2
        for (std::uint64_t i = 0; i < 10; ++i)
            fresh.setState(i, "a", i);
        fresh.handleInputReport(10, nullptr, 0);
        EXPECT_EQ(fresh.frames().size(), 11u) << bound;
    }
}

TEST_F(PipelineRecordingTest, StaticTrimAndSortWorkOnAnyList) {
    FrameList list = Scripted::listFromShortHand("R1@5 a=1@4 R2@3 a=2@2 a=3@1 R3@9 R4@0");
    PipelineRecording::trimFrames(list, 2);
    EXPECT_EQ(shortHand(list), "a=3 R3 R4");
    PipelineRecording::sortFrames(list);
    EXPECT_EQ(shortHand(list), "R4 a=3 R3");
}

// --- Text ----------------------------------------------------------------------------------------

TEST_F(PipelineRecordingTest, TextIsTrimmedAndSortedAndSoIsTheRecording) {
    append("R1@50 R2@40 R3@10 R4@30 R5@20");
    recording.setMaxFrameCount(3);
    append("R6@5 R7@25"); // five frames of at most six
    EXPECT_EQ(recording.json(), R"({"Version":2,"Frames":[)"
                                R"({"Type":"InputReport","Timestamp":5,"Data":"06 "},)"
                                R"({"Type":"InputReport","Timestamp":20,"Data":"05 "},)"
                                R"({"Type":"InputReport","Timestamp":25,"Data":"07 "}]})");
    EXPECT_EQ(shortHand(recording.frames()), "R6 R5 R7");
}

TEST_F(PipelineRecordingTest, TextTrimsByArrivalBeforeItSortsByTime) {
    // The newest to arrive is kept although its time is the oldest.
    recording.setMaxFrameCount(1);
    append("a=1@9");
    recording.appendFrame(reportFrame(1, {7}));
    (void)recording.json();
    EXPECT_EQ(shortHand(recording.frames()), "R7 a=1");
}

TEST_F(PipelineRecordingTest, AnUnboundedTextIsSortedOnly) {
    append("a=1@3 a=2@2 R3@1");
    EXPECT_EQ(recording.json(), R"({"Version":2,"Frames":[)"
                                R"({"Type":"InputReport","Timestamp":1,"Data":"03 "},)"
                                R"({"Type":"State","Timestamp":2,"Key":"a","Value":2},)"
                                R"({"Type":"State","Timestamp":3,"Key":"a","Value":1}]})");
}

TEST_F(PipelineRecordingTest, AnEmptyRecordingIsAnEmptyContainer) {
    EXPECT_EQ(recording.json(), R"({"Version":2,"Frames":[]})");
}

TEST_F(PipelineRecordingTest, ReadsFramesInFileOrderWithoutABound) {
    const char *text = R"({"Version":2,"Frames":[)"
                       R"({"Type":"State","Timestamp":9,"Key":"a","Value":1},)"
                       R"({"Type":"State","Timestamp":3,"Key":"a","Value":2},)"
                       R"({"Type":"InputReport","Timestamp":7,"Data":"05 "}]})";
    PipelineRecording read(text, clock);
    EXPECT_EQ(shortHand(read.frames()), "a=1 a=2 R5");
    EXPECT_EQ(read.frames()[0].timestampNs, 9u);
    EXPECT_EQ(read.maxFrameCount(), 0u);
    EXPECT_EQ(read.pipeline, nullptr);
    EXPECT_FALSE(read.playCanContinue());
    EXPECT_THROW(read.playNextFrame(1.0f), std::runtime_error);
}

TEST_F(PipelineRecordingTest, NoTextIsAnError) {
    try {
        const PipelineRecording read(std::nullopt, clock);
        FAIL() << "nothing was thrown";
    } catch (const std::invalid_argument &error) {
        EXPECT_STREQ(error.what(), "json not supplied");
    }
}

template <typename Clock>
concept TakesBraces = requires(Clock &clock) {
    PipelineRecording({}, clock);
};
static_assert(TakesBraces<Ports::Clock>, "one constructor, not two, is meant");

TEST_F(PipelineRecordingTest, EmptyBracesAreATextThatWasNotSupplied) {
    try {
        const PipelineRecording read({}, clock);
        FAIL() << "nothing was thrown";
    } catch (const std::invalid_argument &error) {
        EXPECT_STREQ(error.what(), "json not supplied");
    }
}

TEST_F(PipelineRecordingTest, FramesCanBeHandedOver) {
    const PipelineRecording made(Scripted::listFromShortHand("R1@9 R2@3"), clock);
    EXPECT_EQ(shortHand(made.frames()), "R1 R2");
    EXPECT_EQ(made.maxFrameCount(), 0u);
    EXPECT_FALSE(made.playCanContinue());
}

// --- Copies --------------------------------------------------------------------------------------

TEST_F(PipelineRecordingTest, ACopyHasFramesBoundAndPipeline) {
    append("R1 R2");
    recording.setMaxFrameCount(5);
    const PipelineRecording copy(recording);
    EXPECT_EQ(shortHand(copy.frames()), "R1 R2");
    EXPECT_EQ(copy.maxFrameCount(), 5u);
    EXPECT_EQ(copy.pipeline, input);
    PipelineRecording assigned(clock);
    assigned = recording;
    EXPECT_EQ(shortHand(assigned.frames()), "R1 R2");
    EXPECT_EQ(assigned.maxFrameCount(), 5u);
    EXPECT_EQ(assigned.pipeline, input);
}

TEST_F(PipelineRecordingTest, ACopyAndItsOriginalGoTheirOwnWay) {
    append("R1 R2 R3@1");
    PipelineRecording copy(recording);
    report(9, {9});
    EXPECT_EQ(shortHand(copy.frames()), "R1 R2 R3");
    (void)copy.json(); // sorts
    EXPECT_EQ(shortHand(copy.frames()), "R1 R3 R2");
    EXPECT_EQ(shortHand(recording.frames()), "R1 R2 R3 R9");
    copy.setMaxFrameCount(1);
    EXPECT_EQ(recording.frames().size(), 4u);
}

TEST_F(PipelineRecordingTest, AMovedRecordingTakesItsFramesAlong) {
    append("R1 R2");
    PipelineRecording moved(std::move(recording));
    EXPECT_EQ(shortHand(moved.frames()), "R1 R2");
    EXPECT_EQ(moved.pipeline, input);
    PipelineRecording assigned(clock);
    assigned.handleInputReport(1, nullptr, 0);
    assigned = std::move(moved);
    EXPECT_EQ(shortHand(assigned.frames()), "R1 R2");
}

TEST(PipelineRecording, RecordsATouchThatReplaysTheSame) {
    Scripted::FakeClock clock;
    const auto pipeline = std::make_shared<Pipeline>(Ports::silentLogProvider());
    std::string live;
    pipeline->onHIDEvents = [&](std::uint64_t t, const HostEventList &events) {
        live += std::to_string(t) + " " + Scripted::eventsText(events) + "\n";
    };
    PipelineRecording recording(clock);
    recording.pipeline = pipeline;
    recording.setState(90, "Algs.HoldTimeoutMilliseconds", 20u);
    std::uint32_t number = 0;
    for (const std::uint32_t timeMs : {1000u, 1010u, 1021u, 1030u}) {
        const Bytes bytes = Scripted::imageReport(number++, timeMs, Scripted::electrodes({{'H', 500}}));
        recording.handleInputReport(timeMs, bytes.data(), bytes.size());
    }
    EXPECT_EQ(live, "1000 may-begin 3\n1021 hold-start 3\n");

    std::string replayed;
    const auto second = std::make_shared<Pipeline>(Ports::silentLogProvider());
    second->onHIDEvents = [&](std::uint64_t t, const HostEventList &events) {
        replayed += std::to_string(t) + " " + Scripted::eventsText(events) + "\n";
    };
    PipelineRecording read(recording.json(), clock);
    read.pipeline = second;
    clock.ticks = 90; // the time of the first frame, so that the replay's times are the recorded ones
    for (read.playReset(); read.playCanContinue();)
        read.playNextFrame(1.0f);
    EXPECT_EQ(replayed, live);
}

} // namespace
} // namespace ZorvaTouch

#include "Shared/PipelineRecording.h"

#include "Tests/Support/RecordingFakes.h"

#include <gtest/gtest.h>

#include <functional>
#include <limits>
#include <stdexcept>
#include <utility>

namespace ZorvaTouch {
namespace {

using Scripted::framesFromShortHand;
using Scripted::metadataFrame;
using Scripted::reportFrame;
using Scripted::shortHand;
using Scripted::stateFrame;
using Call = Scripted::CapturingInput::Call;
using Times = std::vector<std::uint64_t>;

class Playback : public ::testing::Test {
protected:
    Playback() { recording.pipeline = input; }

    void append(std::string_view frames) {
        for (Frame &frame : framesFromShortHand(frames))
            recording.appendFrame(std::move(frame));
    }

    /// Plays from the first frame to the last.
    void playAll(float speed) {
        for (recording.playReset(); recording.playCanContinue();)
            recording.playNextFrame(speed);
    }

    /// The pauses that a playback of these frames makes, in microseconds.
    Times pauses(std::string_view frames, float speed) {
        recording = PipelineRecording(clock);
        recording.pipeline = input;
        append(frames);
        clock.sleeps.clear();
        playAll(speed);
        return clock.pausesUs();
    }

    /// What the pipeline was given, in short hand, since the last call of this.
    std::string takePlayed() {
        std::vector<Frame> frames;
        for (const Call &call : input->calls)
            frames.push_back({call.type, call.timestamp, call.key, call.value, call.data});
        input->calls.clear();
        return shortHand(frames);
    }

    /// The same with the time stamps, as "R1@100".
    std::string takePlayedAt() {
        std::string text;
        for (const Call &call : input->calls)
            text += (text.empty() ? "" : " ") + shortHand({{call.type, 0, call.key, call.value, call.data}}) +
                    "@" + std::to_string(call.timestamp);
        input->calls.clear();
        return text;
    }

    void expectFinished() {
        EXPECT_FALSE(recording.playCanContinue());
        try {
            recording.playNextFrame(1.0f);
            FAIL() << "nothing was thrown";
        } catch (const std::runtime_error &error) {
            EXPECT_STREQ(error.what(), "playback finished");
        }
    }

    Scripted::FakeClock clock;
    std::shared_ptr<Scripted::CapturingInput> input = std::make_shared<Scripted::CapturingInput>();
    PipelineRecording recording{clock};
};

// --- Pauses --------------------------------------------------------------------------------------

TEST_F(Playback, PausesForTheRecordedSpacingDividedBySpeed) {
    const char *frames = "R1@0 R2@10000000 R3@30000000";
    EXPECT_EQ(pauses(frames, 1.0f), (Times{10000, 20000}));
    EXPECT_EQ(pauses(frames, 2.0f), (Times{5000, 10000}));
    EXPECT_EQ(pauses(frames, 0.5f), (Times{20000, 40000}));
    EXPECT_EQ(pauses(frames, 1000.0f), (Times{10, 20}));
}

TEST_F(Playback, ASpeedOfZeroOrLessIsOne) {
    const char *frames = "R1@0 R2@10000000";
    EXPECT_EQ(pauses(frames, 0.0f), Times{10000});
    EXPECT_EQ(pauses(frames, -0.0f), Times{10000});
    EXPECT_EQ(pauses(frames, -1.0f), Times{10000});
    EXPECT_EQ(pauses(frames, -std::numeric_limits<float>::infinity()), Times{10000});
}

TEST_F(Playback, ASpeedThatIsNoNumberOrInfiniteDoesNotPause) {
    const char *frames = "R1@0 R2@10000000 R3@18446744073709551615";
    EXPECT_EQ(pauses(frames, std::numeric_limits<float>::quiet_NaN()), Times{});
    EXPECT_EQ(pauses(frames, -std::numeric_limits<float>::quiet_NaN()), Times{});
    EXPECT_EQ(pauses(frames, std::numeric_limits<float>::infinity()), Times{});
    EXPECT_EQ(takePlayed(), "R1 R2 R3 R1 R2 R3 R1 R2 R3");
}

TEST_F(Playback, DoesNotPauseBeforeTheFirstFrame) {
    EXPECT_EQ(pauses("R1@5000000000", 1.0f), Times{});
    EXPECT_EQ(pauses("R1@5000000000 R2@5000001000", 1.0f), Times{1});
}

TEST_F(Playback, DoesNotPauseWhenTimeStandsStillOrRunsBackwards) {
    EXPECT_EQ(pauses("R1@5000 R2@5000 R3@3000 R4@4000", 1.0f), Times{1})
        << "from 3000 to 4000 is a microsecond";
}

TEST_F(Playback, PausesAreWholeMicroseconds) {
    EXPECT_EQ(pauses("R1@0 R2@999", 1.0f), Times{});
    EXPECT_EQ(pauses("R1@0 R2@1999", 1.0f), Times{1});
    EXPECT_EQ(pauses("R1@0 R2@10000", 3.0f), Times{3}) << "3.33";
}

TEST_F(Playback, PausesAreReckonedInSinglePrecision) {
    // 4000000999 becomes 4000001024, the next multiple of 256; a thousandth of it is 4000001.024. In double
    // precision it would be 4000000.999.
    EXPECT_EQ(pauses("R1@0 R2@4000000999", 1.0f), Times{4000001});
    // Every step is rounded: 109027134111 becomes 109027131392, a multiple of 8192, and its thousandth a
    // multiple of
    // 8. Rounded only at the end it would be 109027136, not rounded at all 109027134.
    EXPECT_EQ(pauses("R1@0 R2@109027134111", 1.0f), Times{109027128});
    // 8191835550 becomes 8191835648, a third of that 2730611968, a thousandth of that 2730612.0. In any other
    // order, and in double precision, 2730611 is left.
    EXPECT_EQ(pauses("R1@0 R2@8191835550", 3.0f), Times{2730612});
}

TEST_F(Playback, AnEqualSpacingIsTakenBeforeItIsRounded) {
    // Late stamps of 2^60 and a bit differ by 5000 ns, which single stamps as floats could not tell.
    EXPECT_EQ(pauses("R1@1152921504606846976 R2@1152921504606851976", 1.0f), Times{5});
}

TEST_F(Playback, ASinglePauseIsAtMostAnHour) {
    EXPECT_EQ(pauses("R1@0 R2@3600000000000", 1.0f), Times{3600000000});
    EXPECT_EQ(pauses("R1@0 R2@7200000000000", 1.0f), Times{3600000000});
    EXPECT_EQ(pauses("R1@0 R2@7200000000000", 4.0f), Times{1800000000}) << "the pause counts, not the gap";
    EXPECT_EQ(pauses("R1@0 R2@18446744073709551615", 1.0f), Times{3600000000});
    EXPECT_EQ(pauses("R1@0 R2@18446744073709551615", std::numeric_limits<float>::denorm_min()),
              Times{3600000000})
        << "an infinite quotient";
    EXPECT_EQ(pauses("R1@0 R2@18446744073709551615 R3@5 R4@3600000000005", 1.0f),
              (Times{3600000000, 3600000000}));
}

TEST_F(Playback, PausesEvenWithoutAPipeline) {
    recording.pipeline = nullptr;
    append("R1@0 R2@10000000");
    playAll(1.0f);
    EXPECT_EQ(clock.pausesUs(), Times{10000});
    EXPECT_FALSE(recording.playCanContinue());
}

// --- Time stamps ---------------------------------------------------------------------------------

TEST_F(Playback, TimeStampsAreTheRecordedOnesMovedToTheStart) {
    // 125 / 3 ns per tick: 10 ms are 240000 ticks.
    clock.base = {125, 3};
    clock.ticks = 1000;
    for (const float speed : {1.0f, 2.0f, 0.0f, std::numeric_limits<float>::quiet_NaN()}) {
        PipelineRecording ticking(clock);
        ticking.pipeline = input;
        for (Frame &frame : framesFromShortHand("a=1@500 R2@10000500 M3@30000500"))
            ticking.appendFrame(std::move(frame));
        for (ticking.playReset(); ticking.playCanContinue();)
            ticking.playNextFrame(speed);
        EXPECT_EQ(input->timestamps(), (Times{1000, 241000, 721000})) << "speed " << speed;
        input->calls.clear();
    }
}

TEST_F(Playback, ReadsTheClockOnceAtReset) {
    append("R1@100 R2@200");
    clock.ticks = 5000;
    recording.playReset();
    clock.ticks = 9000;
    recording.playNextFrame(1.0f);
    clock.ticks = 99000;
    recording.playNextFrame(1.0f);
    EXPECT_EQ(input->timestamps(), (Times{5000, 5100}));
}

TEST_F(Playback, AFrameBeforeTheFirstOneComesBeforeTheStart) {
    append("R1@500 R2@400");
    clock.ticks = 1000;
    playAll(1.0f);
    EXPECT_EQ(input->timestamps(), (Times{1000, 900}));
}

TEST_F(Playback, TimeStampsWrapAsUnsignedNumbers) {
    // 3 x (2^64 - 100) wraps to 2^64 - 300; that divided by 125 is 147573952589676410.5.
    clock.base = {125, 3};
    clock.ticks = 7;
    PipelineRecording ticking(clock);
    ticking.pipeline = input;
    ticking.appendFrame(reportFrame(500, {1}));
    ticking.appendFrame(reportFrame(400, {2}));
    for (ticking.playReset(); ticking.playCanContinue();)
        ticking.playNextFrame(1.0f);
    EXPECT_EQ(input->timestamps(), (Times{7, 147573952589676417}));
}

TEST_F(Playback, ATimeBaseOfNothingPlaysEverythingAtTheStart) {
    clock.base = {0, 3};
    clock.ticks = 42;
    PipelineRecording ticking(clock);
    ticking.pipeline = input;
    ticking.appendFrame(reportFrame(0, {1}));
    ticking.appendFrame(reportFrame(1000, {2}));
    for (ticking.playReset(); ticking.playCanContinue();)
        ticking.playNextFrame(1.0f);
    EXPECT_EQ(input->timestamps(), (Times{42, 42}));
}

// --- What is played ------------------------------------------------------------------------------

TEST_F(Playback, PassesEveryKindOfFrameOn) {
    recording.appendFrame(stateFrame(10, "Algs.ActivationThreshold", 250.5));
    recording.appendFrame(reportFrame(11, {1, 0, 255}));
    recording.appendFrame(metadataFrame(12, "Accel", PropertyValue::Array{1u}));
    recording.appendFrame(reportFrame(13, {}));
    playAll(1.0f);
    EXPECT_EQ(input->calls,
              (std::vector<Call>{{FrameType::State, 0, "Algs.ActivationThreshold", 250.5, {}},
                                 {FrameType::InputReport, 1, "", {}, {1, 0, 255}},
                                 {FrameType::Metadata, 2, "Accel", PropertyValue::Array{1u}, {}},
                                 {FrameType::InputReport, 3, "", {}, {}}}));
}

TEST_F(Playback, AFrameOfAnyOtherKindOnlyTakesItsTime) {
    append("R1@0");
    recording.appendFrame({static_cast<FrameType>(3), 10000000, "k", 1u, {2}});
    append("R3@15000000");
    playAll(1.0f);
    EXPECT_EQ(takePlayed(), "R1 R3");
    EXPECT_EQ(clock.pausesUs(), (Times{10000, 5000}));
}

TEST_F(Playback, PlaysInListOrder) {
    append("R1@30 R2@10 R3@20");
    playAll(1.0f);
    EXPECT_EQ(takePlayed(), "R1 R2 R3");
}

TEST_F(Playback, LeavesTheRecordingAsItIs) {
    append("R1@30 a=1@10 R3@20");
    playAll(1.0f);
    EXPECT_EQ(shortHand(recording.frames()), "R1 a=1 R3");
}

TEST_F(Playback, CrossesChunks) {
    for (std::uint64_t i = 0; i < 200; ++i)
        recording.appendFrame(reportFrame(i, Scripted::patternedReport(i * 5, static_cast<std::uint8_t>(i))));
    playAll(1.0f);
    ASSERT_EQ(input->calls.size(), 200u);
    for (std::uint64_t i = 0; i < 200; ++i)
        EXPECT_EQ(input->calls[i].data, Scripted::patternedReport(i * 5, static_cast<std::uint8_t>(i)));
}

// --- States of a playback ------------------------------------------------------------------------

TEST_F(Playback, DoesNotRunUntilItIsReset) {
    append("R1");
    expectFinished();
    EXPECT_TRUE(input->calls.empty());
}

TEST_F(Playback, AnEmptyRecordingHasNothingToPlay) {
    recording.playReset();
    expectFinished();
}

TEST_F(Playback, IsFinishedAfterTheLastFrame) {
    append("R1 R2");
    recording.playReset();
    EXPECT_TRUE(recording.playCanContinue());
    recording.playNextFrame(1.0f);
    EXPECT_TRUE(recording.playCanContinue());
    recording.playNextFrame(1.0f);
    expectFinished();
    expectFinished();
    EXPECT_EQ(takePlayed(), "R1 R2");
}

TEST_F(Playback, StartsAgainAtAnyTime) {
    append("R1@0 R2@1000000 R3@2000000");
    recording.playReset();
    recording.playNextFrame(1.0f);
    recording.playNextFrame(1.0f);
    clock.sleeps.clear();
    recording.playReset();
    recording.playNextFrame(1.0f);
    EXPECT_EQ(clock.pausesUs(), Times{}) << "the first frame of the new playback";
    EXPECT_EQ(takePlayed(), "R1 R2 R1");
    playAll(1.0f);
    playAll(1.0f);
    EXPECT_EQ(takePlayed(), "R1 R2 R3 R1 R2 R3");
}

TEST_F(Playback, EveryAppendEndsIt) {
    const std::function<void()> appends[] = {
        [&] { recording.appendFrame(reportFrame(9, {9})); },
        [&] { recording.setState(9, "a", 1u); },
        [&] { recording.handleInputReport(9, nullptr, 0); },
        [&] { recording.handleMetadata(9, "m", 1u); },
    };
    for (const auto &appendOne : appends) {
        append("R1 R2 R3");
        recording.playReset();
        recording.playNextFrame(1.0f);
        appendOne();
        expectFinished();
    }
}

TEST_F(Playback, ErrorsOfThePipelinePassThroughAndTheFrameCountsAsPlayed) {
    append("R1@0 R2@10000000 R3@20000000");
    recording.playReset();
    input->beforeNote = [] { throw std::invalid_argument("not this one"); };
    EXPECT_THROW(recording.playNextFrame(1.0f), std::invalid_argument);
    input->beforeNote = nullptr;
    EXPECT_TRUE(recording.playCanContinue());
    recording.playNextFrame(1.0f);
    EXPECT_EQ(clock.pausesUs(), Times{10000}) << "measured from the frame that failed";
    recording.playNextFrame(1.0f);
    EXPECT_EQ(takePlayed(), "R2 R3");
    expectFinished();
}

TEST_F(Playback, AnErrorInTheLastFrameFinishes) {
    append("R1");
    recording.playReset();
    input->beforeNote = [] { throw std::invalid_argument("not this one"); };
    EXPECT_THROW(recording.playNextFrame(1.0f), std::invalid_argument);
    input->beforeNote = nullptr;
    expectFinished();
}

// --- Changes of the list in between --------------------------------------------------------------

TEST_F(Playback, GoesOnAtTheNextKeptFrameWhenTheBoundTakesItsFrame) {
    append("R1@1000 R2@2000 R3@3000 R4@4000");
    clock.ticks = 100;
    recording.playReset();
    recording.playNextFrame(1.0f);
    recording.setMaxFrameCount(2);
    ASSERT_TRUE(recording.playCanContinue());
    recording.playNextFrame(1.0f);
    recording.playNextFrame(1.0f);
    EXPECT_EQ(input->timestamps(), (Times{100, 100, 1100}))
        << "times are measured from the list's present head, R3";
    EXPECT_EQ(clock.pausesUs(), (Times{2, 1})) << "pauses from the frame played last, R1";
    EXPECT_EQ(takePlayed(), "R1 R3 R4");
    expectFinished();
}

TEST_F(Playback, StaysAtItsFrameWhenTheBoundTakesEarlierOnes) {
    append("R1 R2 R3 R4");
    recording.playReset();
    for (int i = 0; i < 3; ++i)
        recording.playNextFrame(1.0f);
    recording.setMaxFrameCount(2);
    recording.playNextFrame(1.0f);
    EXPECT_EQ(takePlayed(), "R1 R2 R3 R4");
    expectFinished();
}

TEST_F(Playback, IsFinishedWhenNothingIsKeptAfterItsFrame) {
    append("a=1 R1 R2 a=2 a=3");
    recording.playReset();
    for (int i = 0; i < 5; ++i)
        recording.playNextFrame(1.0f);
    recording.setMaxFrameCount(1);
    EXPECT_EQ(shortHand(recording.frames()), "a=1 R2 a=3");
    expectFinished();
}

TEST_F(Playback, SettingNoBoundChangesNothing) {
    append("R1 R2");
    recording.playReset();
    recording.playNextFrame(1.0f);
    recording.setMaxFrameCount(0);
    recording.playNextFrame(1.0f);
    EXPECT_EQ(takePlayed(), "R1 R2");
}

TEST_F(Playback, MeasuresTimesFromTheHeadAsItIsAfterThePause) {
    append("R1@1000 R2@2000 R3@3000 R4@4000");
    clock.ticks = 100;
    recording.playReset();
    recording.playNextFrame(1.0f);
    clock.duringSleep = [this] { recording.setMaxFrameCount(3); }; // R1 goes, R2 is the head
    recording.playNextFrame(1.0f);
    clock.duringSleep = [this] { recording.setMaxFrameCount(2); }; // R2 goes, R3 is the head
    recording.playNextFrame(1.0f);
    clock.duringSleep = nullptr;
    recording.playNextFrame(1.0f);
    EXPECT_EQ(takePlayedAt(), "R1@100 R2@100 R3@100 R4@1100");
    expectFinished();
}

TEST_F(Playback, PlaysTheFrameItTookWhenThePauseEmptiesTheList) {
    append("R1@1000 R2@2000");
    clock.ticks = 100;
    recording.playReset();
    recording.playNextFrame(1.0f);
    clock.duringSleep = [this] {
        recording = PipelineRecording(clock);
        recording.pipeline = input;
    };
    recording.playNextFrame(1.0f);
    EXPECT_EQ(shortHand(recording.frames()), "");
    ASSERT_EQ(input->calls.size(), 2u);
    EXPECT_EQ(input->calls[1].data, std::vector<std::uint8_t>{2});
}

TEST_F(Playback, FindsItsFrameAmongEqualTimesWhenTheTextSortsTheList) {
    append("R1@2 R2@1 R3@2 R4@1 R5@2");
    struct Row {
        int played;
        const char *rest;
    };
    constexpr Row kRows[] = {
        {0, "R1 R3 R5"}, {1, "R2 R4 R1 R3 R5"}, {2, "R3 R5"}, {3, "R4 R1 R3 R5"}, {4, "R5"}, {5, ""}};
    for (const auto &[played, rest] : kRows) {
        PipelineRecording copy(recording);
        copy.playReset();
        for (int i = 0; i < played; ++i)
            copy.playNextFrame(1.0f);
        (void)takePlayed();
        (void)copy.json(); // R2 R4 R1 R3 R5
        while (copy.playCanContinue())
            copy.playNextFrame(1.0f);
        EXPECT_EQ(takePlayed(), rest) << played;
    }
}

TEST_F(Playback, PassesOnAReportWithoutAKeyOrAValueThatItWasGiven) {
    for (const std::size_t length : {1u, 76u, 77u}) {
        const auto bytes = Scripted::patternedReport(length, 1);
        recording = PipelineRecording(clock);
        recording.pipeline = input;
        recording.appendFrame({FrameType::InputReport, 0, "key", "value", bytes});
        playAll(1.0f);
        EXPECT_EQ(input->calls.back(), (Call{FrameType::InputReport, 0, {}, {}, bytes})) << length;
        const auto written = PipelineRecording(recording.json(), clock);
        EXPECT_EQ(Scripted::framesOf(written.frames()), (std::vector<Frame>{reportFrame(0, bytes)}))
            << length;
    }
}

TEST_F(Playback, StaysAtItsFrameWhenTheTextSortsTheList) {
    append("R1@3000 R2@1000 R3@2000");
    clock.ticks = 100;
    recording.playReset();
    recording.playNextFrame(1.0f);
    (void)recording.json(); // R2 R3 R1; R2 is next
    while (recording.playCanContinue())
        recording.playNextFrame(1.0f);
    EXPECT_EQ(input->timestamps(), (Times{100, 100, 1100, 2100})) << "R2 is the head now";
    EXPECT_EQ(takePlayed(), "R1 R2 R3 R1");
}

TEST_F(Playback, StaysFinishedWhenTheTextSortsTheList) {
    append("R1@3 R2@1 R3@2");
    playAll(1.0f);
    (void)recording.json();
    expectFinished();
}

TEST_F(Playback, MayBePlayedIntoAPipelineThatAppendsToTheSameRecording) {
    for (std::uint64_t i = 0; i < 100; ++i)
        recording.appendFrame(reportFrame(i, Scripted::patternedReport(600, static_cast<std::uint8_t>(i))));
    input->beforeNote = [this] {
        for (int i = 0; i < 300; ++i)
            recording.appendFrame(metadataFrame(5000, "echo", "of the frame that is being played"));
    };
    recording.playReset();
    recording.playNextFrame(1.0f);
    ASSERT_EQ(input->calls.size(), 1u);
    EXPECT_EQ(input->calls[0].data, Scripted::patternedReport(600, 0)) << "read after the list had changed";
    EXPECT_EQ(recording.frames().size(), 400u);
    expectFinished();
}

/// A pipeline that hands every call back to the recording that it came from.
class EchoInput final : public PipelineInput {
public:
    explicit EchoInput(PipelineRecording &recording) : _recording(&recording) {}

    void setState(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) override {
        once([&] { _recording->setState(timestamp, key, value); });
    }
    void handleInputReport(std::uint64_t timestamp, const std::uint8_t *data, std::size_t length) override {
        once([&] { _recording->handleInputReport(timestamp, data, length); });
    }
    void handleMetadata(std::uint64_t timestamp, const std::string &key,
                        const PropertyValue &value) override {
        once([&] { _recording->handleMetadata(timestamp, key, value); });
    }

private:
    /// The recording passes the echo on as well: that one stays unanswered.
    void once(const std::function<void()> &echo) {
        if (std::exchange(_isEchoing, true))
            return;
        echo();
        _isEchoing = false;
    }

    PipelineRecording *_recording;
    bool _isEchoing = false;
};

TEST_F(Playback, MayBePlayedIntoAPipelineThatEchoesIntoTheSameRecording) {
    const std::string longKey(100, 'k');
    for (const std::uint64_t bound : {0u, 1u, 2u, 3u}) {
        const std::vector<Frame> frames{reportFrame(5, Scripted::patternedReport(73, 1)),
                                        stateFrame(6, longKey, longKey), metadataFrame(7, longKey, longKey),
                                        reportFrame(8, Scripted::patternedReport(600, 2))};
        for (const Frame &frame : frames) {
            recording = PipelineRecording(FrameList(), clock);
            recording.pipeline = std::make_shared<EchoInput>(recording);
            recording.setMaxFrameCount(bound);
            recording.appendFrame(frame);
            recording.playReset();
            recording.playNextFrame(1.0f);
            Frame echo = frame;
            echo.timestampNs = 0; // played at tick 0
            EXPECT_EQ(recording.frames()[recording.frames().size() - 1].toFrame(), echo);
            expectFinished();
        }
    }
}

TEST_F(Playback, AFrameBeingPlayedSurvivesTheTrimThatRemovesIt) {
    recording.setMaxFrameCount(50);
    for (std::uint8_t i = 0; i < 49; ++i) {
        recording.appendFrame(
            stateFrame(i, "a key longer than a short string " + std::to_string(i), std::string(99, 'v')));
        recording.appendFrame(reportFrame(i, Scripted::patternedReport(600, i)));
    }
    input->beforeNote = [this] {
        for (std::uint8_t i = 0; i < 250; ++i)
            recording.appendFrame(reportFrame(1000, Scripted::patternedReport(73, i)));
        for (std::uint64_t i = 0; i < 250; ++i)
            recording.appendFrame(
                stateFrame(1000, "a key longer than a short string " + std::to_string(i % 49), i));
    };
    recording.playReset();
    recording.playNextFrame(1.0f);
    ASSERT_EQ(input->calls.size(), 1u);
    EXPECT_EQ(input->calls[0].key, "a key longer than a short string 0");
    EXPECT_EQ(input->calls[0].value, PropertyValue(std::string(99, 'v')));
}

TEST_F(Playback, APipelineMayTakeTheTextOrStartAgainWhileItIsPlayedTo) {
    append("R1@3 R2@1 R3@2");
    recording.playReset();
    input->beforeNote = [this] { (void)recording.json(); };
    recording.playNextFrame(1.0f); // R1 moves to the end, R2 stays next
    input->beforeNote = nullptr;
    recording.playNextFrame(1.0f);
    EXPECT_EQ(takePlayed(), "R1 R2");
    input->beforeNote = [this] { recording.playReset(); };
    recording.playNextFrame(1.0f);
    input->beforeNote = nullptr;
    recording.playNextFrame(1.0f);
    EXPECT_EQ(takePlayed(), "R3 R2") << "the head of the sorted list";
}

// --- Copies --------------------------------------------------------------------------------------

TEST_F(Playback, ACopyIsNotPlaying) {
    append("R1 R2 R3");
    recording.playReset();
    recording.playNextFrame(1.0f);
    PipelineRecording copy(recording);
    EXPECT_FALSE(copy.playCanContinue());
    EXPECT_THROW(copy.playNextFrame(1.0f), std::runtime_error);
    PipelineRecording playing(clock);
    playing.appendFrame(reportFrame(1, {8}));
    playing.playReset();
    playing = recording;
    EXPECT_FALSE(playing.playCanContinue()) << "not even if it was playing before";
    recording.playNextFrame(1.0f);
    EXPECT_EQ(takePlayed(), "R1 R2") << "the original goes on";
}

TEST_F(Playback, ACopyPlaysByItself) {
    append("R1 R2 R3");
    recording.playReset();
    recording.playNextFrame(1.0f);
    PipelineRecording copy(recording);
    copy.playReset();
    recording.setMaxFrameCount(1);
    copy.playNextFrame(1.0f);
    copy.playNextFrame(1.0f);
    EXPECT_EQ(takePlayed(), "R1 R1 R2");
    recording.playNextFrame(1.0f);
    EXPECT_EQ(takePlayed(), "R3");
}

TEST_F(Playback, SelfAssignmentLeavesAUsableRecording) {
    append("R1 R2 R3");
    recording.playReset();
    PipelineRecording &same = recording;
    recording = same;
    EXPECT_EQ(shortHand(recording.frames()), "R1 R2 R3");
    playAll(1.0f);
    EXPECT_EQ(takePlayed(), "R1 R2 R3");
}

} // namespace
} // namespace ZorvaTouch

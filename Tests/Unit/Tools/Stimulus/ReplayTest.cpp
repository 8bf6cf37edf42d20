#include "Tools/Stimulus/Replay.h"

#include "Tests/Support/RecordingFakes.h"
#include "Tools/Stimulus/StimulusText.h"

#include <gtest/gtest.h>

#include <vector>

namespace ZorvaTouch::Tools {
namespace {

struct ReplayOf {
    explicit ReplayOf(std::string_view text)
        : replay(parseStimulus(text).frames, clock, Ports::silentLogProvider()) {}

    Scripted::FakeClock clock;
    Replay replay;
};

TEST(Replay, TellsWhatEachFrameWasTakenFor) {
    ReplayOf of("meta a 1\nstate b 2\nidle\nreset\nfirmware 7\nraw 07\n");
    std::vector<InputKind> kinds;
    while (of.replay.next()) {
        EXPECT_EQ(of.replay.frame().index, kinds.size());
        kinds.push_back(of.replay.frame().kind);
    }
    EXPECT_EQ(kinds, (std::vector{InputKind::Metadata, InputKind::State, InputKind::Image, InputKind::Reset,
                                  InputKind::Firmware, InputKind::Unhandled}));
    EXPECT_FALSE(of.replay.next());
}

TEST(Replay, ShowsTheFrameAsItWasRecorded) {
    ReplayOf of("state b 2\nidle\nfirmware 7\n");
    ASSERT_TRUE(of.replay.next());
    EXPECT_EQ(of.replay.recorded().key, "b");
    EXPECT_EQ(of.replay.recorded().value, PropertyValue(2u));
    ASSERT_TRUE(of.replay.next());
    EXPECT_EQ(of.replay.recorded().data.size(), 73u);
    ASSERT_TRUE(of.replay.next());
    EXPECT_EQ(of.replay.frame().eventCode, 7);
    EXPECT_EQ(of.replay.frame().timestampNs, 1'010'000'000u);
    EXPECT_EQ(of.replay.offsetNs(), 10'000'000);
}

TEST(Replay, EventsAndDisjointnessAreTheLastFrames) {
    ReplayOf of("touch A=300\nnumber 9\ntouch A=300\ntouch A=300\n");
    ASSERT_TRUE(of.replay.next());
    EXPECT_EQ(of.replay.frame().events.size(), 1u);
    EXPECT_FALSE(of.replay.frame().isDisjoint); // the first image never is
    ASSERT_TRUE(of.replay.next());
    EXPECT_EQ(of.replay.frame().events.size(), 0u);
    EXPECT_TRUE(of.replay.frame().isDisjoint);
    ASSERT_TRUE(of.replay.next());
    EXPECT_FALSE(of.replay.frame().isDisjoint);
}

TEST(Replay, AStateIsSetBeforeTheFirstFrame) {
    ReplayOf of("state Algs.ActivationThreshold 300\n");
    of.replay.setState("ActivationThreshold", 250u);
    EXPECT_EQ(of.replay.pipeline().algs().handStats().activationThreshold, 250.0f);
    ASSERT_TRUE(of.replay.next());
    EXPECT_EQ(of.replay.pipeline().algs().handStats().activationThreshold, 300.0f);
}

} // namespace
} // namespace ZorvaTouch::Tools

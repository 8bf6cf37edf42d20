#include "Tools/Cli/ReplayProof.h"

#include "Tools/Cli/DemoSummary.h"
#include "Tools/Stimulus/Replay.h"
#include "Tools/Stimulus/StimulusText.h"
#include "Tools/Stimulus/VirtualClock.h"

#include <gmock/gmock.h>

#include <functional>

namespace ZorvaTouch::Tools {
namespace {

using ::testing::EndsWith;
using ::testing::HasSubstr;

// May-begin and tap of the first touch at 20 and 70 ms, of the second at 120 and 170 ms, after the first
// frame.
constexpr const char *kTwoTaps = "idle for 20ms\ntouch J=300 for 50ms\nidle for 50ms\n"
                                 "touch J=300 for 50ms\nidle for 50ms\n";

/// What a host hears while these frames are played live; `change` may tamper with each event.
EventHistory historyOf(const FrameList &frames, const std::function<void(HostEvent &)> &change = nullptr) {
    VirtualClock clock;
    Replay replay(frames, clock, Ports::silentLogProvider());
    EventHistory history;
    while (replay.next())
        for (const auto &event : replay.frame().events) {
            HostEvent heard = *event;
            heard.setTimestamp(replay.frame().timestampNs);
            if (change)
                change(heard);
            history.add(heard, gestureOf(heard));
        }
    return history;
}

FrameList withoutFirst(const FrameList &frames, std::size_t count) {
    FrameList rest;
    for (std::size_t i = count; i < frames.size(); ++i)
        rest.append(frames[i].toFrame());
    return rest;
}

TEST(ReplayProof, TheSameFramesGiveTheSameEvents) {
    const FrameList frames = parseStimulus(kTwoTaps).frames;
    const ReplayProof proof = proveReplay(frames, historyOf(frames));
    EXPECT_EQ(proof.reports, 22u);
    EXPECT_EQ(proof.events, 4u);
    EXPECT_FALSE(proof.fromNs);
    EXPECT_FALSE(proof.difference);
}

TEST(ReplayProof, NothingIsTheSameAsNothing) {
    const ReplayProof proof = proveReplay({}, {});
    EXPECT_EQ(proof.reports, 0u);
    EXPECT_EQ(proof.events, 0u);
    EXPECT_FALSE(proof.difference);
}

TEST(ReplayProof, AnEventWithAnotherFrameNumberIsADifference) {
    const FrameList frames = parseStimulus(kTwoTaps).frames;
    const auto history = historyOf(frames, [](HostEvent &event) {
        if (event.integerField(kDigitizerFieldFrameNumber) == 8)
            event.setIntegerField(kDigitizerFieldFrameNumber, 9);
    });
    const ReplayProof proof = proveReplay(frames, history);
    ASSERT_TRUE(proof.difference);
    EXPECT_EQ(proof.difference->index, 1u);
    EXPECT_THAT(proof.difference->heard,
                EndsWith(" ns {\"mask\":131072,\"phase\":null,\"y\":3,\"frame\":9}"));
    EXPECT_THAT(proof.difference->replayed,
                EndsWith(" ns {\"mask\":131072,\"phase\":null,\"y\":3,\"frame\":8}"));
}

TEST(ReplayProof, AnEventAtAnotherTimeIsADifference) {
    const FrameList frames = parseStimulus(kTwoTaps).frames;
    const auto history =
        historyOf(frames, [](HostEvent &event) { event.setTimestamp(event.timestamp() + 1); });
    ASSERT_TRUE(proveReplay(frames, history).difference);
    EXPECT_EQ(proveReplay(frames, history).difference->index, 0u);
}

TEST(ReplayProof, AnEventThatWasNotHeardIsADifference) {
    const FrameList frames = parseStimulus(kTwoTaps).frames;
    const ReplayProof proof = proveReplay(frames, {});
    ASSERT_TRUE(proof.difference);
    EXPECT_EQ(proof.difference->heard, "");
    EXPECT_THAT(proof.difference->replayed, HasSubstr("\"phase\":128"));
}

TEST(ReplayProof, AfterACutItComparesFromTheFirstTouchOn) {
    const FrameList frames = parseStimulus(kTwoTaps).frames;
    // Without the first 4 images the recording begins in the middle of the first touch.
    const ReplayProof proof = proveReplay(withoutFirst(frames, 4), historyOf(frames));
    EXPECT_EQ(proof.reports, 18u);
    EXPECT_EQ(proof.events, 2u);
    EXPECT_EQ(proof.fromNs, frames[12].timestampNs);
    EXPECT_FALSE(proof.difference);
}

TEST(ReplayProof, AfterACutTouchesThatTheMemoryTellsApartDoNotCount) {
    // The tap in the volume-up region draws the next touch there, if it is remembered: J/E is 390/421.
    const FrameList frames = parseStimulus("touch J=300 for 50ms\nidle for 100ms\n"
                                           "touch E=220 J=260 for 20ms\nidle for 3000ms\n"
                                           "touch J=300 for 50ms\nidle for 50ms\n")
                                 .frames;
    const ReplayProof proof = proveReplay(withoutFirst(frames, 8), historyOf(frames));
    EXPECT_FALSE(proof.difference);
    EXPECT_EQ(proof.events, 2u);
    EXPECT_EQ(proof.fromNs, frames[5 + 10 + 2 + 300].timestampNs);
}

TEST(ReplayProof, AfterACutWithoutATouchThereIsNothingToCompare) {
    const FrameList frames = parseStimulus("touch J=300 for 50ms\nidle for 50ms\n").frames;
    const ReplayProof proof = proveReplay(withoutFirst(frames, 7), historyOf(frames));
    EXPECT_EQ(proof.events, 0u);
    EXPECT_EQ(proof.fromNs, kNothingCompared);
    EXPECT_FALSE(proof.difference);
}

// --- What is said of it

DemoSummary summaryWith(const ReplayProof &proof) {
    return {.plugIn = "a.so",
            .version = "1",
            .finger = {.scenario = Synth::scenarioNamed("day"), .parameters = {}, .seed = 1, .seconds = 1},
            .handledReports = 2,
            .droppedReports = 1,
            .counters = {},
            .recordingFile = "a.json",
            .proof = proof,
            .comparedFromNs = std::nullopt};
}

TEST(DemoSummary, TellsADifferenceWithBothEvents) {
    const ReplayProof proof{.reports = 1,
                            .events = 3,
                            .fromNs = std::nullopt,
                            .difference = ReplayDifference{.index = 2, .heard = "7 ns {}", .replayed = ""}};
    std::string text;
    appendForPerson(text, summaryWith(proof), false);
    EXPECT_EQ(text, "  events        none\n"
                    "  reports       2 handled, 1 lost on the way\n"
                    "  recording     a.json\n"
                    "  replayed      1 report: event 3 differs\n"
                    "                host    7 ns {}\n"
                    "                replay  nothing\n");
    text.clear();
    appendForPrograms(text, summaryWith(proof));
    EXPECT_THAT(text,
                EndsWith("\"replay\":{\"reports\":1,\"events\":3,\"same\":false,\"fromTimeNs\":null}}}\n"));
}

TEST(DemoSummary, TellsWhatWasCompared) {
    DemoSummary summary = summaryWith({.reports = 5, .events = 1, .fromNs = 9, .difference = std::nullopt});
    summary.comparedFromNs = 1'500'000'000;
    std::string text;
    appendForPerson(text, summary, false);
    EXPECT_THAT(text, EndsWith("replayed      5 reports: the same 1 event\n"
                               "                from 1.500 s on; older reports are trimmed\n"));
    text.clear();
    appendForPrograms(text, summary);
    EXPECT_THAT(text, EndsWith("\"same\":true,\"fromTimeNs\":1500000000}}}\n"));
    summary.comparedFromNs = kNothingCompared;
    text.clear();
    appendForPerson(text, summary, false);
    EXPECT_THAT(text,
                EndsWith("                older reports are trimmed, no later touch can be compared\n"));
}

} // namespace
} // namespace ZorvaTouch::Tools

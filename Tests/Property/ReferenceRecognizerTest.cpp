#include "Bench/Reference/RecognizerPair.h"

#include "Synth/Stream.h"
#include "Tests/Support/FramesGenerators.h"
#include "Tests/Support/SensorSequence.h"
#include "Tools/Stimulus/StimulusText.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>

// The recognizer and the plain one beside the benchmarks give the same texts, frame by frame. The plain one
// was written down from the rules alone, so a difference means that one of the two has a rule wrong.

namespace ZorvaTouch {
namespace {

namespace gen = rc::gen;
using Reference::RecognizerPair;
using Scripted::Dice;
using Scripted::KeyWrite;
using Scripted::oddStateWrite;
using Scripted::SensorFrame;
using Scripted::SensorSequence;
using Scripted::StateWrite;

constexpr int kFramesPerSequence = 20'000;
constexpr int kFramesBetweenStates = 100;

/// What a sequence has made happen.
struct Reached {
    std::set<std::string> phrases;     ///< first words of the gesture phrases
    std::set<std::string> eventStarts; ///< events up to the region: mask and phase
};

void note(Reached &reached, const RecognizerPair &pair) {
    const std::string phrase = pair.phrase();
    reached.phrases.insert(phrase.substr(0, phrase.find(' ')));
    reached.eventStarts.insert(pair.events().substr(0, pair.events().find(",\"y\"")));
}

/// @param writesAndResets  Once in how many frames a state is written, and half as often the device resets;
///                         0 for never.
std::string differenceOnSequence(std::uint64_t seed, int writesAndResets, Reached *reached = nullptr) {
    SensorSequence sequence(seed);
    Dice &dice = sequence.dice();
    RecognizerPair pair;
    for (int frame = 0; frame < kFramesPerSequence && pair.difference().empty(); ++frame) {
        pair.handleImage(sequence.next());
        if (reached)
            note(*reached, pair);
        if (frame % kFramesBetweenStates == 0)
            pair.compareStates();
        if (writesAndResets == 0)
            continue;
        if (dice.onceIn(writesAndResets)) {
            const StateWrite write = oddStateWrite(dice);
            pair.setState(write.key, write.value);
        }
        if (dice.onceIn(2 * writesAndResets))
            pair.handleReset();
    }
    pair.compareStates();
    return pair.difference();
}

InputReport::Image imageOf(const SensorFrame &frame, std::uint32_t number) {
    InputReport::Image image{};
    image.frameNumber = number;
    image.timeMs = frame.timeMs;
    image.signals = frame.signals;
    return image;
}

TEST(ReferenceRecognizer, GivesTheSameTextsOnLongSequences) {
    for (const std::uint64_t seed : {1u, 2u})
        EXPECT_EQ(differenceOnSequence(seed, 0), "") << "seed " << seed;
}

TEST(ReferenceRecognizer, GivesTheSameTextsWithRareStateWritesAndResets) {
    for (const std::uint64_t seed : {3u, 4u})
        EXPECT_EQ(differenceOnSequence(seed, 40), "") << "seed " << seed;
}

TEST(ReferenceRecognizer, GivesTheSameTextsWithFrequentStateWritesAndResets) {
    for (const std::uint64_t seed : {5u, 6u})
        EXPECT_EQ(differenceOnSequence(seed, 3), "") << "seed " << seed;
}

TEST(ReferenceRecognizer, TheSequencesReachEveryPhraseAndEvent) {
    Reached reached;
    EXPECT_EQ(differenceOnSequence(7, 0, &reached), "");
    EXPECT_EQ(differenceOnSequence(8, 40, &reached), "");
    EXPECT_THAT(reached.phrases,
                ::testing::UnorderedElementsAre("", "STARTTOUCH", "STARTHOLD", "HOLDING", "SUPPRESSHOLD",
                                                "TOUCHING", "ENDHOLD", "SUPPRESSTAP", "TAP", "ENDTOUCH"));
    EXPECT_THAT(reached.eventStarts,
                ::testing::UnorderedElementsAre("", R"({"mask":0,"phase":128)", R"({"mask":2,"phase":1)",
                                                R"({"mask":2,"phase":2)", R"({"mask":2,"phase":4)",
                                                R"({"mask":131072,"phase":null)", R"({"mask":0,"phase":8)"));
}

TEST(ReferenceRecognizer, GivesTheSameTextsOnEveryGoldenCase) {
    std::size_t caseCount = 0;
    for (const auto &entry : std::filesystem::directory_iterator(ZORVA_TEST_DIR "/Golden")) {
        if (entry.path().extension() != ".txt")
            continue;
        std::stringstream text;
        text << std::ifstream(entry.path()).rdbuf();
        RecognizerPair pair;
        for (const FrameView &frame : Tools::parseStimulus(text.str()).frames)
            pair.handleFrame(frame);
        pair.compareStates();
        EXPECT_EQ(pair.difference(), "") << entry.path().filename();
        ++caseCount;
    }
    EXPECT_GT(caseCount, 40u);
}

TEST(ReferenceRecognizer, GivesTheSameTextsOnEveryMadeUpHand) {
    constexpr std::uint64_t kSeed = 11;
    constexpr double kSeconds = 30;
    for (const Synth::Scenario &scenario : Synth::scenarios()) {
        RecognizerPair pair;
        for (const FrameView &frame :
             Synth::synthesize(scenario, Synth::parametersOf(scenario), kSeed, kSeconds))
            pair.handleFrame(frame);
        pair.compareStates();
        EXPECT_EQ(pair.difference(), "") << scenario.name;
    }
}

RC_GTEST_PROP(ReferenceRecognizer, GivesTheSameTextsOnAnyFramesAndWrites, ()) {
    RecognizerPair pair;
    const std::vector<SensorFrame> frames = *Scripted::anySensorFrames();
    const std::vector<KeyWrite> writes = *Scripted::upTo(40, Scripted::keyWrite());
    const auto resetEvery = *gen::inRange<std::size_t>(10, 60);
    for (std::size_t i = 0; i < frames.size(); ++i) {
        if (i % 3 == 2 && i / 3 < writes.size())
            pair.setState(writes[i / 3].key.substr(5), writes[i / 3].value); // without "Algs."
        pair.handleImage(imageOf(frames[i], static_cast<std::uint32_t>(i)));
        if (i % resetEvery == resetEvery - 1)
            pair.handleReset();
    }
    pair.compareStates();
    RC_ASSERT(pair.difference() == "");
}

RC_GTEST_PROP(ReferenceRecognizer, GivesTheSameTextsOnFingerVisits, ()) {
    RecognizerPair pair;
    std::uint32_t number = 0;
    for (const SensorFrame &frame : Scripted::framesOf(*Scripted::fingerVisits()))
        pair.handleImage(imageOf(frame, number++));
    pair.compareStates();
    RC_ASSERT(pair.difference() == "");
}

} // namespace
} // namespace ZorvaTouch

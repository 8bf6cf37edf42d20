#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"
#include "Shared/RecordingContainer.h"
#include "Tests/OutOfMemory/Refusal.h"
#include "Tests/Support/RecordingFakes.h"

#include <gtest/gtest.h>

#include <functional>
#include <limits>
#include <memory>
#include <ranges>
#include <string>
#include <vector>

// Each allocation of each call is refused in turn. Whatever the call was to change is then as it was before
// or as it is after a call that succeeds, and nothing in between.

namespace ZorvaTouch {
namespace {

using Scripted::framesOf;
using Scripted::metadataFrame;
using Scripted::patternedReport;
using Scripted::reportFrame;
using Scripted::stateFrame;
using Testing::forEachRefusal;
using Testing::Refusal;

const std::string kLongText(1000, 't');
const std::string kLongKey(100, 'k');
/// Where an append begins a chunk, and where it does not.
constexpr std::size_t kSizes[] = {0, 1, 63, 64, 65, 128};

/// Reports, with a state write or a metadata item in between now and then; times run backwards.
FrameList mixedList(std::size_t count) {
    FrameList list;
    for (std::size_t i = 0; i < count; ++i) {
        const std::uint64_t time = 1000 - i;
        if (i % 7 == 3)
            list.append(stateFrame(time, kLongKey + std::to_string(i % 5), kLongText));
        else if (i % 7 == 5)
            list.append(metadataFrame(time, kLongKey, kLongText));
        else
            list.appendReport(time, patternedReport(i % 2 ? 73 : 600, static_cast<std::uint8_t>(i)));
    }
    return list;
}

void expectUsable(FrameList list) {
    EXPECT_EQ(list.empty(), list.begin() == list.end());
    EXPECT_EQ(static_cast<std::size_t>(std::ranges::distance(list)), list.size());
    EXPECT_FALSE(writeRecordingContainer(list).empty());
    list.append(reportFrame(1, {1}));
    EXPECT_EQ(list[list.size() - 1].toFrame(), reportFrame(1, {1}));
}

// --- Values --------------------------------------------------------------------------------------

TEST(OutOfMemory, ACopyOfAValueNeedsNoMemory) {
    for (const PropertyValue &value : {PropertyValue(kLongText), PropertyValue(PropertyValue::Bytes(1000)),
                                       PropertyValue(PropertyValue::Array{kLongText, kLongText}),
                                       PropertyValue(PropertyValue::Dictionary{{kLongKey, kLongText}})}) {
        EXPECT_EQ(forEachRefusal([&](Refusal &refusal) {
                      refusal.during([&] {
                          const PropertyValue copy(value);
                          PropertyValue assigned;
                          assigned = copy;
                      });
                  }),
                  0u);
    }
}

// --- The list ------------------------------------------------------------------------------------

using ListChange = void (*)(FrameList &);

/// Refuses memory to a change of a list, and compares what is left with the list before and after it.
void expectAllOrNothing(const ListChange &change) {
    std::uint64_t refusals = 0;
    for (const std::size_t size : kSizes) {
        SCOPED_TRACE(std::to_string(size) + " frames");
        const std::vector<Frame> before = framesOf(mixedList(size));
        FrameList changed = mixedList(size);
        change(changed);
        const std::vector<Frame> after = framesOf(changed);
        refusals += forEachRefusal([&](Refusal &refusal) {
            FrameList list = mixedList(size);
            const FrameList copy = list; // shares chunks with it
            const bool isDone = refusal.allows([&] { change(list); });
            EXPECT_EQ(framesOf(list), isDone ? after : before);
            EXPECT_EQ(framesOf(copy), before);
            EXPECT_TRUE(isDone || refusal.hasHappened());
            expectUsable(list);
        });
    }
    EXPECT_GT(refusals, 0u) << "nothing was refused";
}

TEST(OutOfMemory, AnAppendedReportIsInTheListWholeOrNotAtAll) {
    expectAllOrNothing([](FrameList &list) { list.appendReport(5, std::vector<std::uint8_t>(73, 7)); });
    expectAllOrNothing([](FrameList &list) { list.appendReport(5, std::vector<std::uint8_t>(600, 7)); });
}

TEST(OutOfMemory, AnAppendedFrameIsInTheListWholeOrNotAtAll) {
    expectAllOrNothing([](FrameList &list) { list.append(stateFrame(5, kLongKey, kLongText)); });
    expectAllOrNothing([](FrameList &list) { list.append(metadataFrame(5, kLongKey, kLongText)); });
    expectAllOrNothing([](FrameList &list) { list.append(reportFrame(5, patternedReport(600, 1))); });
}

TEST(OutOfMemory, ATrimIsDoneWhollyOrNotAtAll) {
    expectAllOrNothing([](FrameList &list) { list.trim(0); });
    expectAllOrNothing([](FrameList &list) { list.trim(1); });
    expectAllOrNothing([](FrameList &list) { list.trim(40); });
    expectAllOrNothing([](FrameList &list) { list.trim(100); });
}

TEST(OutOfMemory, ASortIsDoneWhollyOrNotAtAll) {
    expectAllOrNothing([](FrameList &list) { list.sort(); });
}

TEST(OutOfMemory, ACopyIsMadeWhollyOrNotAtAll) {
    expectAllOrNothing([](FrameList &list) {
        static const FrameList source = mixedList(70);
        list = source;
    });
}

TEST(OutOfMemory, ASparseListIsRebuiltWhollyOrNotAtAll) {
    const auto sparse = [] {
        FrameList list;
        for (std::uint64_t i = 0; i < 12; ++i) {
            list.append(stateFrame(i, kLongKey + std::to_string(i), kLongText));
            for (int report = 0; report < 70; ++report)
                list.appendReport(i, patternedReport(73, 1));
        }
        return list;
    };
    const std::vector<Frame> before = framesOf(sparse());
    FrameList changed = sparse();
    changed.trim(1);
    const std::vector<Frame> after = framesOf(changed);
    ASSERT_EQ(after.size(), 13u);
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  FrameList list = sparse();
                  const bool isDone = refusal.allows([&] { list.trim(1); });
                  EXPECT_EQ(framesOf(list), isDone ? after : before);
                  expectUsable(list);
              }),
              0u);
}

TEST(OutOfMemory, WhatATrimWouldKeepIsCountedOrNotAtAll) {
    const FrameList list = mixedList(200);
    const std::size_t kept = list.countKept(50, 100);
    forEachRefusal([&](Refusal &refusal) {
        std::size_t counted = kept;
        if (refusal.allows([&] { counted = list.countKept(50, 100); })) {
            EXPECT_EQ(counted, kept);
        }
    });
}

// --- The recording -------------------------------------------------------------------------------

/// A recording at a bound that its next frame doubles, halfway through a playback.
class RecordingOutOfMemory : public ::testing::Test {
protected:
    static constexpr std::uint64_t kBound = 40;

    std::unique_ptr<PipelineRecording> makeRecording() {
        auto recording = std::make_unique<PipelineRecording>(mixedList(2 * kBound - 1), clock);
        recording->playReset();
        for (int frame = 0; frame < 60; ++frame)
            recording->playNextFrame(std::numeric_limits<float>::infinity());
        return recording;
    }
    /// Sets the bound without a trim.
    std::unique_ptr<PipelineRecording> makeBoundedRecording() {
        auto recording = std::make_unique<PipelineRecording>(clock);
        recording->setMaxFrameCount(kBound);
        for (const FrameView frame : mixedList(2 * kBound - 1))
            recording->appendFrame(frame.toFrame());
        recording->playReset();
        return recording;
    }

    using Change = std::function<void(PipelineRecording &)>;
    void expectAllOrNothing(const Change &change, bool endsPlayback) {
        const std::vector<Frame> before = framesOf(makeBoundedRecording()->frames());
        auto changed = makeBoundedRecording();
        change(*changed);
        const std::vector<Frame> after = framesOf(changed->frames());
        EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                      const auto recording = makeBoundedRecording();
                      const bool isDone = refusal.allows([&] { change(*recording); });
                      EXPECT_EQ(framesOf(recording->frames()), isDone ? after : before);
                      EXPECT_EQ(recording->playCanContinue(), !(isDone && endsPlayback));
                      expectUsable(recording->frames());
                      EXPECT_FALSE(recording->json().empty());
                  }),
                  0u);
    }

    Scripted::FakeClock clock;
};

TEST_F(RecordingOutOfMemory, AnInputIsRecordedWhollyOrNotAtAll) {
    const std::vector<std::uint8_t> image = patternedReport(73, 9), longer = patternedReport(600, 9);
    const PropertyValue value(kLongText);
    expectAllOrNothing([&](PipelineRecording &r) { r.handleInputReport(5, image.data(), image.size()); },
                       true);
    expectAllOrNothing([&](PipelineRecording &r) { r.handleInputReport(5, longer.data(), longer.size()); },
                       true);
    expectAllOrNothing([&](PipelineRecording &r) { r.setState(5, kLongKey, value); }, true);
    expectAllOrNothing([&](PipelineRecording &r) { r.handleMetadata(5, kLongKey, value); }, true);
    expectAllOrNothing([&](PipelineRecording &r) { r.appendFrame(stateFrame(5, kLongKey, value)); }, true);
}

TEST_F(RecordingOutOfMemory, AnInputThatIsNotRecordedIsNotPassedOn) {
    const PropertyValue value(kLongText);
    const auto input = std::make_shared<Scripted::CapturingInput>();
    forEachRefusal([&](Refusal &refusal) {
        const auto recording = makeBoundedRecording();
        recording->pipeline = input;
        input->calls.clear();
        input->calls.reserve(1);
        const std::size_t size = recording->frames().size();
        const bool isDone = refusal.allows([&] { recording->setState(5, kLongKey, value); });
        const FrameView last = recording->frames()[recording->frames().size() - 1];
        const bool isRecorded = recording->frames().size() != size;
        EXPECT_EQ(isRecorded, last.timestampNs == 5) << "the new frame is the last one";
        EXPECT_TRUE(input->calls.empty() || isRecorded);
        EXPECT_EQ(isDone, input->calls.size() == 1);
        if (isRecorded) {
            EXPECT_EQ(last.toFrame(), stateFrame(5, kLongKey, value));
        }
    });
}

TEST_F(RecordingOutOfMemory, ABoundIsSetWithItsTrimOrNotAtAll) {
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  const auto recording = makeRecording();
                  const std::size_t size = recording->frames().size();
                  const bool isDone = refusal.allows([&] { recording->setMaxFrameCount(30); });
                  EXPECT_EQ(recording->maxFrameCount(), isDone ? 30u : 0u);
                  EXPECT_EQ(recording->frames().size() < size, isDone);
                  std::size_t left = 0;
                  for (; recording->playCanContinue(); ++left)
                      recording->playNextFrame(std::numeric_limits<float>::infinity());
                  EXPECT_EQ(left, 19u) << "what follows the sixtieth frame, of 79";
              }),
              0u);
}

TEST_F(RecordingOutOfMemory, ATextIsWholeOrNotThere) {
    const std::string whole = makeRecording()->json();
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  const auto recording = makeRecording();
                  std::string text;
                  if (refusal.allows([&] { text = recording->json(); })) {
                      EXPECT_EQ(text, whole);
                  }
                  EXPECT_EQ(recording->frames().size(), 79u);
                  EXPECT_EQ(recording->json(), whole) << "tried again";
              }),
              0u);
}

TEST_F(RecordingOutOfMemory, ACopyIsWholeOrNotThere) {
    const auto original = makeRecording();
    const std::vector<Frame> frames = framesOf(original->frames());
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  PipelineRecording copy(clock);
                  const bool isDone = refusal.allows([&] { copy = *original; });
                  EXPECT_EQ(framesOf(copy.frames()), isDone ? frames : std::vector<Frame>());
                  EXPECT_EQ(framesOf(original->frames()), frames);
              }),
              0u);
}

// --- The container -------------------------------------------------------------------------------

TEST_F(RecordingOutOfMemory, AContainerIsReadWhollyOrNotAtAll) {
    const std::string current = writeRecordingContainer(mixedList(70));
    const std::vector<std::string> texts{
        current,
        R"({"Version":1,"Frames":[{"Type":"InputReport","Timestamp":5,"Report":"01 02"},)"
        R"({"Type":"State","Timestamp":6,"Key":"k","Value":"a text longer than a short string"}]})",
        R"({"Version":0,"Reports":[{"Timestamp":5,"ReportData":"01 02"},{"Timestamp":6,"ReportData":"03"}]})"};
    for (const std::string &text : texts) {
        const std::vector<Frame> expected = framesOf(readRecordingContainer(text).frames);
        EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                      std::unique_ptr<PipelineRecording> read;
                      // Any other exception would say that the text is at fault.
                      const bool isDone =
                          refusal.allows([&] { read = std::make_unique<PipelineRecording>(text, clock); });
                      EXPECT_EQ(read != nullptr, isDone);
                      if (read) {
                          EXPECT_EQ(framesOf(read->frames()), expected);
                      }
                  }),
                  0u);
    }
}

TEST_F(RecordingOutOfMemory, ARefusedContainerIsRefusedForItsOwnReasonOrForMemory) {
    for (const char *text : {"{", R"({"Version":-2.0})", R"({"Version":2,"Frames":[{"Type":"State"}]})",
                             R"({"Version":1,"Frames":[{}]})",
                             R"({"Version":2,"Frames":[{"Type":"InputReport","Timestamp":1,"Data":"x"}]})"}) {
        const auto refusalOf = [&](auto call) -> std::string {
            try {
                call();
            } catch (const std::bad_alloc &) {
                return "memory";
            } catch (const std::exception &error) {
                return error.what();
            }
            return "nothing was thrown";
        };
        const std::string reason = refusalOf([&] { const PipelineRecording read(text, clock); });
        forEachRefusal([&](Refusal &refusal) {
            const std::string_view view = text;
            std::string met =
                refusalOf([&] { refusal.during([&] { const PipelineRecording read(view, clock); }); });
            EXPECT_TRUE(met == reason || (met == "memory" && refusal.hasHappened())) << met;
        });
    }
}

// --- Playback ------------------------------------------------------------------------------------

TEST_F(RecordingOutOfMemory, AFrameThatWasNotPlayedIsStillNext) {
    const auto input = std::make_shared<Scripted::CapturingInput>();
    for (const bool hasLongReport : {false, true}) {
        PipelineRecording recorded(clock);
        recorded.appendFrame(stateFrame(1, kLongKey, kLongText));
        recorded.appendFrame(reportFrame(2, patternedReport(hasLongReport ? 600 : 73, 1)));
        for (int frame = 0; frame < 2; ++frame) {
            EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                          PipelineRecording recording(recorded);
                          recording.playReset();
                          for (int before = 0; before < frame; ++before)
                              recording.playNextFrame(1.0f);
                          const bool isDone = refusal.allows([&] { recording.playNextFrame(1.0f); });
                          // Nothing took the frame: with a pipeline, it would count as played.
                          recording.pipeline = input;
                          input->calls.clear();
                          while (recording.playCanContinue())
                              recording.playNextFrame(1.0f);
                          EXPECT_EQ(input->calls.size(),
                                    static_cast<std::size_t>(2 - frame - (isDone ? 1 : 0)));
                      }),
                      0u);
        }
    }
}

// --- The pipeline --------------------------------------------------------------------------------

TEST(OutOfMemory, APipelineTakesAStateOrLeavesItAndGoesOn) {
    const PropertyValue value(150.0);
    for (const std::string key :
         {"Algs.ActivationThreshold", "Algs.VirtualNormalizationFactors.3", "Algs.Unknown"}) {
        forEachRefusal([&](Refusal &refusal) {
            Pipeline pipeline(Ports::silentLogProvider());
            const bool isDone = refusal.allows([&] { pipeline.setState(0, key, value); });
            const PropertyValue read = pipeline.getState(key);
            if (isDone && key != "Algs.Unknown") {
                EXPECT_EQ(read, value);
            }
            pipeline.setState(0, key, value);
            EXPECT_EQ(pipeline.getState(key), key == "Algs.Unknown" ? PropertyValue() : value);
        });
    }
}

TEST(OutOfMemory, APipelineAnswersAStateWhollyOrNotAtAll) {
    const Pipeline pipeline(Ports::silentLogProvider());
    for (const std::string key :
         {"DebugInfo", "Algs.DebugInfo", "Algs.EventStats", "Algs.HoldTimeoutMilliseconds"}) {
        const PropertyValue whole = pipeline.getState(key);
        ASSERT_FALSE(whole.isNull()) << key;
        forEachRefusal([&](Refusal &refusal) {
            PropertyValue value = whole;
            (void)refusal.allows([&] { value = pipeline.getState(key); });
            EXPECT_EQ(value, whole) << key;
        });
    }
}

} // namespace
} // namespace ZorvaTouch

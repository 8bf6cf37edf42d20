#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"
#include "Shared/RecordingContainer.h"
#include "Tests/Support/FramesGenerators.h"
#include "Tests/Support/FramesScript.h"
#include "Tests/Support/RecordingFakes.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <stdexcept>

namespace ZorvaTouch {
namespace {

namespace gen = rc::gen;
using Scripted::FakeClock;
using Scripted::framesOf;
using Scripted::fullRange;
using Scripted::KeyWrite;
using Scripted::SensorFrame;
using Scripted::upTo;

/// A recording in front of a pipeline whose batches are written down.
struct Rig {
    explicit Rig(PipelineRecording made) : recording(std::move(made)) {
        pipeline->onHIDEvents = [this](std::uint64_t timestamp, const HostEventList &events) {
            for (const auto &event : events)
                transcript += std::to_string(timestamp) + " " + jsonText(*event) + "\n";
        };
        recording.pipeline = pipeline;
    }
    Rig(const Rig &) = delete;
    Rig &operator=(const Rig &) = delete;

    void playAll() {
        for (recording.playReset(); recording.playCanContinue();)
            recording.playNextFrame(1.0f);
    }

    /// All tunables, as text: a NaN among them is equal to itself that way.
    [[nodiscard]] std::string tunables() const {
        std::string text;
        for (const char *key : {"EnableHoldSuppression", "EnableTapSuppression", "HoldTimeoutMilliseconds",
                                "ActivationThreshold"})
            appendState(text, key);
        for (std::size_t i = 0; i < kVirtualPixelCount; ++i)
            appendState(text, "VirtualNormalizationFactors." + std::to_string(i));
        return text;
    }

    std::string transcript;
    std::shared_ptr<Pipeline> pipeline = std::make_shared<Pipeline>(Ports::silentLogProvider());
    PipelineRecording recording;

private:
    void appendState(std::string &text, const std::string &key) const {
        const PropertyValue value = pipeline->getState("Algs." + key);
        text += std::to_string(static_cast<int>(value.kind())) + " " + std::to_string(value.toFloat()) + "\n";
    }
};

/// Feeds images, key writes and device resets, one per tick.
void feed(PipelineRecording &recording, const std::vector<SensorFrame> &frames,
          const std::vector<KeyWrite> &writes) {
    std::uint64_t tick = 1000;
    for (std::size_t i = 0; i < frames.size(); ++i) {
        if (i < writes.size())
            recording.setState(tick++, writes[i].key, writes[i].value);
        const auto report = i % 31 == 30 ? Scripted::firmwareReport(0)
                                         : Scripted::imageReport(static_cast<std::uint32_t>(i),
                                                                 frames[i].timeMs, frames[i].signals);
        recording.handleInputReport(tick++, report.data(), report.size());
    }
}

std::vector<KeyWrite> anyKeyWrites() { return *upTo(30, Scripted::keyWrite()); }

RC_GTEST_PROP(RecordingProperty, WrittenTextReadsBackToTheSameText, ()) {
    FakeClock clock;
    PipelineRecording recording(clock);
    for (const Frame &frame : *Scripted::anyFrames())
        recording.appendFrame(frame);
    const std::string text = recording.json();
    PipelineRecording read(text, clock);
    RC_ASSERT(read.json() == text);
    RC_ASSERT(read.frames().size() == recording.frames().size());
}

RC_GTEST_PROP(RecordingProperty, FramesReadBackAsTheyWere, ()) {
    FrameList list;
    for (Frame frame : *Scripted::anyFrames()) {
        if (frame.type != FrameType::InputReport)
            frame.value = frame.value.asBytes() ? PropertyValue("bytes come back as text") : frame.value;
        list.append(std::move(frame));
    }
    const std::string text = writeRecordingContainer(list);
    const FrameList read = readRecordingContainer(text).frames;
    RC_ASSERT(read.size() == list.size());
    for (std::size_t i = 0; i < list.size(); ++i) {
        RC_ASSERT(read[i].type == list[i].type);
        RC_ASSERT(read[i].timestampNs == list[i].timestampNs);
        RC_ASSERT(read[i].key == list[i].key);
        RC_ASSERT(framesOf(read)[i].data == framesOf(list)[i].data);
        const auto kind = list[i].value.kind();
        if (kind != PropertyValue::Kind::Array && kind != PropertyValue::Kind::Dictionary)
            RC_ASSERT(read[i].value == list[i].value);
    }
}

RC_GTEST_PROP(RecordingProperty, DamagedTextIsRefusedOrReadsAsAContainer, ()) {
    FrameList list;
    for (const Frame &frame : *upTo(4, Scripted::crowdedFrame()))
        list.append(frame);
    std::string text = writeRecordingContainer(list);
    const int cuts = *fullRange(gen::inRange(1, 4));
    for (int i = 0; i < cuts; ++i) {
        const auto at = *fullRange(gen::inRange<std::size_t>(0, text.size()));
        const char replacement = *gen::elementOf(std::string("{}[]\",:0123456789eE+-.\\u \xFF\x80tfn"));
        text[at] = replacement;
    }
    FakeClock clock;
    std::string again;
    try {
        again = PipelineRecording(text, clock).json();
    } catch (const std::invalid_argument &) {
        return;
    } catch (const std::runtime_error &) {
        return;
    }
    RC_TAG("still a container");
    RC_ASSERT(again.starts_with(R"({"Version":2,"Frames":[)"));
}

RC_GTEST_PROP(RecordingProperty, AReplaySaysWhatWasSaidLive, ()) {
    FakeClock clock;
    clock.ticks = 1000; // the live run's first tick, so that the replay's stamps are the recorded ones
    Rig live{PipelineRecording(clock)};
    feed(live.recording, Scripted::framesOf(*Scripted::fingerVisits()), anyKeyWrites());
    Rig replay{PipelineRecording(live.recording.frames(), clock)};
    replay.playAll();
    RC_ASSERT(replay.transcript == live.transcript);
    RC_ASSERT(replay.tunables() == live.tunables());
}

RC_GTEST_PROP(RecordingProperty, ReplayingTwiceSaysTheSameTwice, ()) {
    FakeClock clock;
    clock.base = {125, 3};
    PipelineRecording source(clock);
    feed(source, *Scripted::anySensorFrames(), anyKeyWrites());
    std::string texts[2];
    for (std::string &text : texts) {
        Rig replay{PipelineRecording(source.frames(), clock)};
        replay.playAll();
        text = replay.transcript;
    }
    RC_ASSERT(texts[0] == texts[1]);
}

RC_GTEST_PROP(RecordingProperty, ATrimmedReplayEndsInTheSameTunables, ()) {
    FakeClock clock;
    Rig live{PipelineRecording(clock)};
    feed(live.recording, Scripted::framesOf(*Scripted::fingerVisits()), anyKeyWrites());
    const std::string expected = live.tunables();
    const std::size_t reports = live.recording.frames().size();
    for (std::size_t cut = 0; cut <= std::min<std::size_t>(reports, 40); ++cut) {
        FrameList kept = live.recording.frames();
        PipelineRecording::trimFrames(kept, cut);
        Rig replay{PipelineRecording(std::move(kept), clock)};
        replay.playAll();
        RC_ASSERT(replay.tunables() == expected);
    }
}

RC_GTEST_PROP(RecordingProperty, ABoundedRecordingReplaysToTheSameTunables, ()) {
    FakeClock clock;
    Rig live{PipelineRecording(clock)};
    live.recording.setMaxFrameCount(*fullRange(gen::inRange<std::uint64_t>(1, 20)));
    feed(live.recording, Scripted::framesOf(*Scripted::fingerVisits()), anyKeyWrites());
    Rig replay{PipelineRecording(live.recording.json(), clock)};
    replay.playAll();
    RC_ASSERT(replay.tunables() == live.tunables());
}

} // namespace
} // namespace ZorvaTouch

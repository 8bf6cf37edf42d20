#include "Fuzz/ShortRecording.h"
#include "Fuzz/Transcript.h"
#include "Shared/RecordingContainer.h"

#include <string>
#include <string_view>

// Targets: Shared/Algs.cpp Shared/AlgsStateKeys.cpp Shared/EventStats.cpp Shared/FrameList.cpp
// Shared/HandStats.cpp Shared/Pipeline.cpp Shared/PipelineRecording.cpp Shared/Pixel.cpp
// Shared/StateDescription.cpp Shared/SVM.cpp Shared/Util/PropertyValue.cpp Shared/Util/StateKey.cpp
// Shared/VirtualImage.cpp
//
// Length: 160
//
// State writes of every kind of value to every key, mixed with images and other reports: nothing crashes, the
// recording replays to the same events and state, a bounded recording keeps its tunables, and what is written
// of the recording is a container that is read again, unless a value is one that JSON does not have.

using namespace ZorvaTouch;

namespace {

void apply(const Frame &frame, PipelineRecording &recording) {
    switch (frame.type) {
    case FrameType::State:
        return recording.setState(frame.timestampNs, frame.key, frame.value);
    case FrameType::InputReport:
        return recording.handleInputReport(frame.timestampNs, frame.data.data(), frame.data.size());
    case FrameType::Metadata:
        return recording.handleMetadata(frame.timestampNs, frame.key, frame.value);
    }
}

void demandReadsBack(PipelineRecording &recording) {
    const std::string written = recording.json();
    try {
        ZORVA_MUST(readRecordingContainer(written).frames.size() == recording.frames().size());
    } catch (const FrameError &error) {
        // The one thing that is not read back: a value of null, or a number that became null.
        ZORVA_MUST(std::string_view(error.what()).ends_with("value class"));
    }
}

/// Any state can be described as text.
void demandDescribes(const Pipeline &pipeline) {
    const std::array<std::int16_t, kElectrodeCount> noSignals{};
    ZORVA_MUST(!pipeline.algs().touchStateDescription(noSignals, 0).empty());
    ZORVA_MUST(!pipeline.algs().virtualStateDescription(noSignals, 0).empty());
    ZORVA_MUST(pipeline.getState("Algs.EventStats").asDictionary());
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    Fuzzing::ShortRecordingReader reader({data, size});
    Fuzzing::StillClock clock;
    Fuzzing::TranscribedPipeline live;
    PipelineRecording recording(clock);
    recording.pipeline = live.pipeline();
    PipelineRecording bounded(clock);
    bounded.setMaxFrameCount(reader.bound());
    while (const auto frame = reader.next()) {
        apply(*frame, recording);
        apply(*frame, bounded);
    }

    Fuzzing::TranscribedPipeline replayed;
    replayed.play(recording.frames());
    ZORVA_MUST(live.transcript() == replayed.transcript());

    Fuzzing::TranscribedPipeline fromBounded;
    fromBounded.play(bounded.frames());
    ZORVA_MUST(live.tunables() == fromBounded.tunables());

    demandReadsBack(recording);
    demandDescribes(*live.pipeline());
    return 0;
}

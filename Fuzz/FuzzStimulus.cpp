#include "Fuzz/Transcript.h"
#include "Shared/RecordingContainer.h"
#include "Tools/Stimulus/StimulusText.h"

#include <string_view>

// Targets: Tools/Stimulus/EventNames.cpp Tools/Stimulus/ExpectedLine.cpp Tools/Stimulus/LineWords.cpp
// Tools/Stimulus/StimulusText.cpp Tools/Stimulus/StimulusTimeline.cpp
//
// Length: 512
//
// The text form: no text crashes the parser or makes it run away, and what it makes can be written and read
// back.

using namespace ZorvaTouch;

namespace {

constexpr std::size_t kMaxFrames = 64; // a longer recording says nothing new about the text and takes long

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    FrameList frames;
    try {
        frames = Tools::parseStimulus({reinterpret_cast<const char *>(data), size}, kMaxFrames).frames;
    } catch (const Tools::StimulusError &) {
        return 0;
    }
    const std::string written = writeRecordingContainer(frames);
    try {
        ZORVA_MUST(writeRecordingContainer(readRecordingContainer(written).frames) == written);
    } catch (const FrameError &error) {
        // The one thing that is not read back: a value of null.
        ZORVA_MUST(std::string_view(error.what()).ends_with("value class"));
    }
    Fuzzing::demandReplayAgrees(frames);
    return 0;
}

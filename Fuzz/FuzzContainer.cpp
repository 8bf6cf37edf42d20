#include "Fuzz/Transcript.h"
#include "Shared/RecordingContainer.h"

#include <algorithm>
#include <string_view>

// Targets: Shared/FrameList.cpp Shared/RecordingContainer.cpp Shared/Util/Hex.cpp Shared/Util/Json.cpp
//
// Length: 2048
//
// The container reader: no text crashes it, and what it reads is written and read back the same.

using namespace ZorvaTouch;

namespace {

bool sameFrames(const FrameList &left, const FrameList &right) {
    return std::equal(left.begin(), left.end(), right.begin(), right.end(),
                      [](const FrameView &a, const FrameView &b) { return a.toFrame() == b.toFrame(); });
}

/// A null value is written without "Value", and such a frame is refused when read: the one thing not to read
/// back.
bool hasNullValue(const FrameList &frames) {
    return std::any_of(frames.begin(), frames.end(), [](const FrameView &frame) {
        return frame.type != FrameType::InputReport && frame.value.isNull();
    });
}

void demandReadsBack(const FrameList &frames) {
    const std::string written = writeRecordingContainer(frames);
    const FrameList again = readRecordingContainer(written).frames;
    ZORVA_MUST(sameFrames(frames, again));
    ZORVA_MUST(written == writeRecordingContainer(again));
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    FrameList frames;
    try {
        frames = readRecordingContainer({reinterpret_cast<const char *>(data), size}).frames;
    } catch (const std::exception &) {
        return 0;
    }
    if (!hasNullValue(frames))
        demandReadsBack(frames);
    Fuzzing::demandReplayAgrees(frames);
    return 0;
}

#include "Tools/Cli/LiveSource.h"

#include "Synth/Stream.h"
#include "Tools/Cli/Documents.h"

#include <algorithm>
#include <memory>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

/// The same time before the end as in a recording that is made: the last gesture has come out by then.
constexpr Synth::Microseconds kTail = 200'000;

/// A finger's frames up to its end.
class FingerFrames {
public:
    explicit FingerFrames(const SimulatedFinger &finger)
        : _end(finger.seconds ? Synth::microseconds(*finger.seconds) : Synth::Script::kForEver),
          _stream(*finger.scenario, finger.parameters, finger.seed, lastContact(_end)) {}

    [[nodiscard]] std::optional<Frame> next() {
        Frame frame = _stream.next();
        return _stream.now() < _end ? std::optional(std::move(frame)) : std::nullopt;
    }

private:
    static Synth::Microseconds lastContact(Synth::Microseconds end) {
        return end == Synth::Script::kForEver ? end : end - std::min(end, kTail);
    }

    Synth::Microseconds _end;
    Synth::Stream _stream;
};

/// Looks at the first frame, for its time, and gives it back.
LiveSource startingWithItsFirstFrame(Simulated::FrameSource frames) {
    auto first = std::make_shared<std::optional<Frame>>(frames());
    const std::uint64_t startNs = *first ? (*first)->timestampNs : 0;
    return {.frames = [first, frames = std::move(frames)]() -> std::optional<Frame> {
                return *first ? std::exchange(*first, std::nullopt) : frames();
            },
            .startNs = startNs};
}

} // namespace

LiveSource playFinger(const SimulatedFinger &finger) {
    const auto frames = std::make_shared<FingerFrames>(finger);
    return startingWithItsFirstFrame([frames] { return frames->next(); });
}

LiveSource playRecording(const std::string &file, Environment &environment) {
    return startingWithItsFirstFrame(Simulated::framesOf(readRecording(file, environment).frames));
}

} // namespace ZorvaTouch::Tools

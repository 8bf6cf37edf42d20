#include "Tools/Cli/LiveSource.h"

#include "Tools/Cli/Documents.h"

#include <memory>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

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

LiveSource playFinger(const SimulatedFinger &finger) { return startingWithItsFirstFrame(framesOf(finger)); }

LiveSource playRecording(const std::string &file, Environment &environment) {
    return startingWithItsFirstFrame(Simulated::framesOf(readRecording(file, environment).frames));
}

} // namespace ZorvaTouch::Tools

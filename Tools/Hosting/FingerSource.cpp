#include "Tools/Hosting/FingerSource.h"

#include "Synth/Stream.h"

#include <algorithm>
#include <memory>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr double kAccelRate = 100; ///< Hz, what the service asks for

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

} // namespace

SimulatedFinger fingerOf(const Synth::Scenario &scenario) {
    SimulatedFinger finger{.scenario = &scenario,
                           .parameters = Synth::parametersOf(scenario),
                           .seed = 1,
                           .seconds = scenario.duration};
    finger.parameters.accelRate = kAccelRate;
    return finger;
}

Simulated::FrameSource framesOf(const SimulatedFinger &finger) {
    const auto frames = std::make_shared<FingerFrames>(finger);
    return [frames] { return frames->next(); };
}

} // namespace ZorvaTouch::Tools

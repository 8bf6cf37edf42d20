#pragma once

#include "Shared/Frame.h"
#include "Shared/FrameList.h"
#include "Synth/Accelerometer.h"
#include "Synth/Baseline.h"
#include "Synth/Clock.h"
#include "Synth/Parameters.h"
#include "Synth/Random.h"
#include "Synth/Scenario.h"
#include "Synth/Script.h"
#include "Synth/SensorModel.h"

#include <cstdint>
#include <deque>
#include <functional>

namespace ZorvaTouch::Synth {

/// A device that nobody built, with somebody touching it: its reports, and what really happened, for ever.
///
///     const Scenario &taps = *scenarioNamed("taps");
///     Stream stream(taps, parametersOf(taps), 1);
///     for (;;)
///         use(stream.next());
///
/// The same arguments give the same frames on every machine. Memory does not grow with time.
///
/// Threads: none of its own; the caller serialises.
class Stream {
public:
    static constexpr std::uint64_t kStartNs = 1'000'000'000;

    /// @param scenario    Who touches. Borrowed for the call.
    /// @param parameters  `parametersOf` the scenario, or what was made of them.
    /// @param end         No contact lasts beyond this.
    /// @param startNs     Host time of the beginning.
    Stream(const Scenario &scenario, const Parameters &parameters, std::uint64_t seed,
           Microseconds end = Script::kForEver, std::uint64_t startNs = kStartNs);

    /// The next frame in order of host time: an image report, a firmware event, or metadata: a label once its
    /// contact is over, an accelerometer sample.
    [[nodiscard]] Frame next();
    /// The time of the measurement that the last frame belongs to.
    [[nodiscard]] Microseconds now() const noexcept { return _clock.now(); }

private:
    Stream(const Scenario &scenario, const Parameters &parameters, Random seeds, Microseconds end,
           std::uint64_t startNs);

    void step();
    void sampleAcceleration();
    void resetDevice(Microseconds time);
    void finishContacts(Microseconds time);
    void label(const Contact &contact, Microseconds end);
    void measure();
    void deliver(std::vector<std::uint8_t> report, Microseconds time);
    void note(const char *key, PropertyValue value, Microseconds time);

    Parameters _parameters;
    Script _script;
    SensorModel _sensor;
    Baseline _baseline;
    Clock _clock;
    Accelerometer _accelerometer;
    Random _link;
    std::deque<Frame> _ready;
};

/// A whole recording: what a stream gives in a time, as long as all its contacts are over by then.
/// @param seconds    Not negative.
/// @param onAdvance  If given, called at each frame with the time that has been made so far.
[[nodiscard]] FrameList synthesize(const Scenario &scenario, const Parameters &parameters, std::uint64_t seed,
                                   double seconds,
                                   const std::function<void(Microseconds made)> &onAdvance = {});

} // namespace ZorvaTouch::Synth

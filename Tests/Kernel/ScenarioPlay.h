#pragma once

#include "Shared/Frame.h"
#include "Synth/Stream.h"

#include <cstdint>
#include <optional>

namespace ZorvaTouch::KernelTests {

/// A finger's reports and labels, each at its time after the beginning.
class ScenarioPlay {
public:
    /// @param seconds  When it ends; the last touch is over a little earlier, so that its gesture still
    /// comes.
    ScenarioPlay(const Synth::Scenario &scenario, std::uint64_t seed, double seconds);

    /// The next frame; nothing at the end.
    [[nodiscard]] const std::optional<Frame> &next() const noexcept { return _next; }
    /// When it is due, ns since the beginning.
    [[nodiscard]] std::uint64_t nextNs() const noexcept {
        return _next->timestampNs - Synth::Stream::kStartNs;
    }
    void advance();

private:
    Synth::Microseconds _end;
    Synth::Stream _stream;
    std::optional<Frame> _next;
};

/// A label's times turned from the sensor's clock to ns since the beginning.
class LabelTimes {
public:
    /// What the finger did: {"kind", "region", "startMs", "endMs"} of the sensor's clock, and "startNs",
    /// "endNs".
    /// @param label   Labels come in order.
    /// @param dueNs   The label's own time: a contact's end.
    /// @param baseNs  Of the monotonic clock, of the beginning.
    [[nodiscard]] PropertyValue::Dictionary describe(const PropertyValue &label, std::uint64_t dueNs,
                                                     std::uint64_t baseNs);

private:
    std::uint64_t _contactEndMs = 0, _contactEndNs = 0; ///< the last contact's: slides are told after it
};

} // namespace ZorvaTouch::KernelTests

#pragma once

#include "Synth/Contact.h"
#include "Synth/Parameters.h"
#include "Synth/Random.h"
#include "Synth/Scenario.h"

#include <cstdint>
#include <limits>
#include <optional>
#include <vector>

namespace ZorvaTouch::Synth {

/// The contacts of a scenario, one after the other for ever, thought out as time goes on.
class Script {
public:
    static constexpr Microseconds kForEver = std::numeric_limits<Microseconds>::max();

    /// @param end  No contact lasts beyond this: of the last episodes only those that are short enough begin.
    Script(const Scenario &scenario, const Parameters &parameters, Random random, Microseconds end);

    /// Begins the episodes that begin up to `time`, in order.
    void advance(Microseconds time);

    /// Those that have begun and those of their episodes that will; starts are since the stream's beginning.
    [[nodiscard]] std::vector<Contact> &contacts() noexcept { return _contacts; }
    /// The next reset up to `time`, once.
    [[nodiscard]] std::optional<Microseconds> takeReset(Microseconds time) noexcept;

private:
    void thinkOfNext();
    void begin(const Episode &episode, Microseconds start);

    EpisodeMaker _make;
    Parameters _parameters;
    Random _random;
    Microseconds _end;
    Microseconds _nextStart; ///< of `_next`; `kForEver` when nothing comes any more
    Episode _next;
    std::vector<Contact> _contacts;
    std::vector<Microseconds> _resets;
};

} // namespace ZorvaTouch::Synth

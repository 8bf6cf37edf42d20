#pragma once

#include "Synth/Contact.h"
#include "Synth/Parameters.h"
#include "Synth/Random.h"

#include <optional>
#include <vector>

/// What hands do to the sensor, one thing at a time. All lengths, places and pressures are drawn anew each
/// time; Docs/Synth.md has their ranges.
namespace ZorvaTouch::Synth {

/// Contacts that belong together.
struct Episode {
    std::vector<Contact> contacts;
    std::optional<Microseconds> reset; ///< the device resets, this long after the episode's beginning
    Microseconds pause = 0;            ///< nothing happens, after the last contact

    [[nodiscard]] Microseconds contactsEnd() const noexcept;
    [[nodiscard]] Microseconds length() const noexcept { return contactsEnd() + pause; }
};

using EpisodeMaker = Episode (*)(Random &random, const Parameters &parameters);

[[nodiscard]] Episode makeTap(Random &random, const Parameters &parameters);
[[nodiscard]] Episode makeDoubleTap(Random &random, const Parameters &parameters);
[[nodiscard]] Episode makeHold(Random &random, const Parameters &parameters);
[[nodiscard]] Episode makeLongHold(Random &random, const Parameters &parameters);
[[nodiscard]] Episode makeSlide(Random &random, const Parameters &parameters);
/// A palm, or something half as broad.
[[nodiscard]] Episode makePalm(Random &random, const Parameters &parameters);
/// A thumb at one side; sometimes a tap elsewhere meanwhile.
[[nodiscard]] Episode makeThumb(Random &random, const Parameters &parameters);
[[nodiscard]] Episode makeGraze(Random &random, const Parameters &parameters);
[[nodiscard]] Episode makeWater(Random &random, const Parameters &parameters);
/// A tap, a hold or a palm, and a reset in the middle of it.
[[nodiscard]] Episode makeReset(Random &random, const Parameters &parameters);
/// A tap or a hold.
[[nodiscard]] Episode makeTapOrHold(Random &random, const Parameters &parameters);
[[nodiscard]] Episode makeNothing(Random &random, const Parameters &parameters);
/// Any of the above, the frequent ones more often, and a long pause.
[[nodiscard]] Episode makeAnything(Random &random, const Parameters &parameters);

} // namespace ZorvaTouch::Synth

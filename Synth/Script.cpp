#include "Synth/Script.h"

#include <algorithm>

namespace ZorvaTouch::Synth {
namespace {

constexpr Microseconds kLeadIn = 300'000; ///< before the first episode: the firmware finds its baseline

constexpr int kTries = 20; ///< to think of an episode that is short enough

/// Whether a span fits in up to `end`.
bool fits(Microseconds start, Microseconds length, Microseconds end) noexcept {
    return start <= end && length <= end - start;
}

} // namespace

Script::Script(const Scenario &scenario, const Parameters &parameters, Random random, Microseconds end)
    : _make(scenario.make), _parameters(parameters), _random(random), _end(end), _nextStart(kLeadIn) {
    thinkOfNext();
}

void Script::advance(Microseconds time) {
    while (_nextStart <= time) {
        begin(_next, _nextStart);
        _nextStart += _next.length();
        thinkOfNext();
    }
}

std::optional<Microseconds> Script::takeReset(Microseconds time) noexcept {
    if (_resets.empty() || _resets.front() > time)
        return std::nullopt;
    const Microseconds reset = _resets.front();
    _resets.erase(_resets.begin());
    return reset;
}

void Script::thinkOfNext() {
    for (int tries = 0; tries < kTries; ++tries) {
        _next = _make(_random, _parameters);
        if (fits(_nextStart, _next.contactsEnd(), _end))
            return;
    }
    _nextStart = kForEver;
}

void Script::begin(const Episode &episode, Microseconds start) {
    for (const Contact &contact : episode.contacts) {
        _contacts.push_back(contact);
        _contacts.back().start += start;
    }
    if (episode.reset)
        _resets.push_back(start + *episode.reset);
}

} // namespace ZorvaTouch::Synth

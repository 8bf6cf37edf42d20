#include "Tests/Kernel/ScenarioPlay.h"

#include "Synth/Labels.h"

#include <algorithm>
#include <string>

namespace ZorvaTouch::KernelTests {
namespace {

constexpr Synth::Microseconds kTail = 200'000;
constexpr std::uint64_t kNanosecondsPerMs = 1'000'000;

std::uint64_t numberIn(const PropertyValue &label, std::string_view key) {
    const PropertyValue *const number = label.find(key);
    return number ? number->toUnsigned() : 0;
}

} // namespace

ScenarioPlay::ScenarioPlay(const Synth::Scenario &scenario, std::uint64_t seed, double seconds)
    : _end(Synth::microseconds(seconds)),
      _stream(scenario, Synth::parametersOf(scenario), seed, _end - std::min(_end, kTail)) {
    advance();
}

void ScenarioPlay::advance() {
    _next = _stream.next();
    if (_stream.now() >= _end)
        _next.reset();
}

PropertyValue::Dictionary LabelTimes::describe(const PropertyValue &label, std::uint64_t dueNs,
                                               std::uint64_t baseNs) {
    const PropertyValue kind = *label.find("Kind");
    const std::uint64_t startMs = numberIn(label, "StartMs"), endMs = numberIn(label, "EndMs");
    if (*kind.asString() != "Slide") {
        _contactEndMs = endMs;
        _contactEndNs = dueNs;
    }
    const auto hostNs = [this, baseNs](std::uint64_t ms) {
        const std::uint64_t beforeEndNs = (_contactEndMs - std::min(ms, _contactEndMs)) * kNanosecondsPerMs;
        return baseNs + _contactEndNs - std::min(_contactEndNs, beforeEndNs);
    };
    return {{"kind", kind},   {"region", numberIn(label, "Region")}, {"startMs", startMs},
            {"endMs", endMs}, {"startNs", hostNs(startMs)},          {"endNs", hostNs(endMs)}};
}

} // namespace ZorvaTouch::KernelTests

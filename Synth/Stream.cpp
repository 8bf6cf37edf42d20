#include "Synth/Stream.h"

#include "Synth/Labels.h"
#include "Synth/Reports.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Synth {
namespace {

constexpr Microseconds kTail = 200'000; ///< of a recording: the last contact's gesture has come out by then
constexpr Microseconds kRepeatDelay = 100; ///< between an image and the same again

} // namespace

Stream::Stream(const Scenario &scenario, const Parameters &parameters, std::uint64_t seed, Microseconds end,
               std::uint64_t startNs)
    : Stream(scenario, parameters, Random(seed), end, startNs) {}

// Each part draws from a generator of its own, in the order of the members: so the contacts stay where they
// are when the noise changes.
Stream::Stream(const Scenario &scenario, const Parameters &parameters, Random seeds, Microseconds end,
               std::uint64_t startNs)
    : _parameters(parameters), _script(scenario, _parameters, seeds.split(), end),
      _sensor(_parameters, seeds.split()), _baseline(_parameters),
      _clock(startNs, _parameters, seeds.split()), _accelerometer(_parameters, seeds.split()),
      _link(seeds.split()) {}

Frame Stream::next() {
    while (_ready.empty())
        step();
    Frame frame = std::move(_ready.front());
    _ready.pop_front();
    return frame;
}

void Stream::step() {
    _clock.step();
    _script.advance(now());
    sampleAcceleration();
    while (const auto reset = _script.takeReset(now()))
        resetDevice(*reset);
    finishContacts(now());
    measure();
}

void Stream::sampleAcceleration() {
    while (const auto time = _accelerometer.takeSample(now()))
        note(kAccelKey, _accelerometer.measure(_script.contacts(), *time), *time);
}

void Stream::resetDevice(Microseconds time) {
    finishContacts(time);
    for (Contact &contact : _script.contacts()) {
        if (contact.start >= time)
            continue;
        label(contact, time);
        contact.kind = ContactKind::Remainder;
    }
    deliver(resetReport(), time);
    _clock.reset(time);
    _baseline.reset();
}

void Stream::finishContacts(Microseconds time) {
    std::vector<Contact> &contacts = _script.contacts();
    for (const Contact &contact : contacts)
        if (contact.end() <= time)
            label(contact, contact.end());
    std::erase_if(contacts, [time](const Contact &contact) { return contact.end() <= time; });
}

void Stream::label(const Contact &contact, Microseconds end) {
    for (PropertyValue &value : labelsOf(contact, end, _clock))
        note(kLabelKey, std::move(value), end);
}

void Stream::measure() {
    std::vector<Blob> blobs;
    for (const Contact &contact : _script.contacts())
        if (contact.start <= now())
            blobs.push_back(contact.blobAt(now() - contact.start, _parameters));
    const SensorModel::RawCounts raw = _sensor.measure(blobs, _clock.stepSeconds());
    if (_clock.isBooting())
        return;
    const Baseline::Signals signals = _baseline.update(raw, _clock.stepSeconds());
    const auto report = imageReport(_clock.takeFrameNumber(), _clock.sensorMs(now()), raw, signals);
    const bool isDropped = _link.chance(_parameters.dropRate / 100);
    const bool isRepeated = _link.chance(_parameters.repeatRate / 100);
    if (isDropped)
        return;
    deliver(report, now());
    if (isRepeated)
        deliver(report, now() + kRepeatDelay);
}

void Stream::deliver(std::vector<std::uint8_t> report, Microseconds time) {
    _ready.push_back({.type = FrameType::InputReport,
                      .timestampNs = _clock.reportHostNs(time),
                      .key = {},
                      .value = {},
                      .data = std::move(report)});
}

void Stream::note(const char *key, PropertyValue value, Microseconds time) {
    _ready.push_back({.type = FrameType::Metadata,
                      .timestampNs = _clock.hostNs(time),
                      .key = key,
                      .value = std::move(value),
                      .data = {}});
}

FrameList synthesize(const Scenario &scenario, const Parameters &parameters, std::uint64_t seed,
                     double seconds, const std::function<void(Microseconds made)> &onAdvance) {
    const Microseconds end = microseconds(seconds);
    Stream stream(scenario, parameters, seed, end - std::min(end, kTail));
    FrameList frames;
    for (Frame frame = stream.next(); stream.now() < end; frame = stream.next()) {
        frames.append(std::move(frame));
        if (onAdvance)
            onAdvance(stream.now());
    }
    return frames;
}

} // namespace ZorvaTouch::Synth

#include "Tests/Support/FramesGenerators.h"

#include "Shared/Util/Hex.h"
#include "Shared/Util/Json.h"
#include "Tests/Support/RecordingFakes.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <map>
#include <ostream>

namespace ZorvaTouch {

void showValue(const PropertyValue &value, std::ostream &os) { os << Util::jsonText(value); }

void showValue(const Frame &frame, std::ostream &os) {
    os << "{type " << static_cast<std::uint32_t>(frame.type) << ", " << frame.timestampNs << " ns, key "
       << Util::jsonText(frame.key) << ", value " << Util::jsonText(frame.value) << ", data "
       << Util::hexStringFromBytes(frame.data) << "}";
}

namespace Scripted {
namespace {

namespace gen = rc::gen;

rc::Gen<std::int16_t> anyCounts() {
    return gen::weightedOneOf<std::int16_t>({{6, gen::just<std::int16_t>(0)},
                                             {3, gen::inRange<std::int16_t>(-100, 200)},
                                             {2, gen::inRange<std::int16_t>(0, 1200)},
                                             {1, gen::arbitrary<std::int16_t>()}});
}

rc::Gen<std::uint32_t> anyTimeStep() {
    return gen::weightedOneOf<std::uint32_t>({{8, gen::inRange<std::uint32_t>(0, 40)},
                                              {2, gen::inRange<std::uint32_t>(400, 1500)},
                                              {1, gen::arbitrary<std::uint32_t>()}});
}

rc::Gen<std::vector<std::uint8_t>> anyReport() {
    return gen::oneOf(gen::map(gen::inRange<std::size_t>(0, 90),
                               [](std::size_t length) { return patternedReport(length, 7); }),
                      gen::element(patternedReport(73, 1), patternedReport(76, 2), patternedReport(77, 3),
                                   patternedReport(600, 4)),
                      gen::arbitrary<std::vector<std::uint8_t>>());
}

std::string utf8FromCodePoint(std::uint32_t code) {
    const auto tail = [code](int shift) { return static_cast<char>(0x80 | ((code >> shift) & 0x3F)); };
    if (code < 0x80)
        return {static_cast<char>(code)};
    if (code < 0x800)
        return {static_cast<char>(0xC0 | (code >> 6)), tail(0)};
    if (code < 0x10000)
        return {static_cast<char>(0xE0 | (code >> 12)), tail(6), tail(0)};
    return {static_cast<char>(0xF0 | (code >> 18)), tail(12), tail(6), tail(0)};
}

rc::Gen<std::uint32_t> anyCodePoint() {
    return gen::weightedOneOf<std::uint32_t>({{6, gen::inRange<std::uint32_t>(0x20, 0x7F)},
                                              {2, gen::inRange<std::uint32_t>(0, 0x20)},
                                              {2, gen::inRange<std::uint32_t>(0x7F, 0xD800)},
                                              {1, gen::inRange<std::uint32_t>(0xE000, 0x110000)}});
}

rc::Gen<double> finiteDouble() {
    const auto fromBits = gen::map(gen::arbitrary<std::uint64_t>(),
                                   [](std::uint64_t bits) { return std::bit_cast<double>(bits); });
    return gen::suchThat(
        gen::oneOf(fromBits, gen::arbitrary<double>(),
                   gen::map(gen::arbitrary<float>(), [](float value) { return static_cast<double>(value); }),
                   gen::map(gen::arbitrary<std::int32_t>(),
                            [](std::int32_t value) { return static_cast<double>(value); })),
        [](double value) { return std::isfinite(value); });
}

rc::Gen<PropertyValue> scalar() {
    return gen::oneOf(
        gen::map(gen::arbitrary<bool>(), [](bool value) { return PropertyValue(value); }),
        gen::map(gen::arbitrary<std::uint64_t>(), [](std::uint64_t value) { return PropertyValue(value); }),
        gen::map(finiteDouble(), [](double value) { return PropertyValue(value); }),
        gen::map(text(), [](std::string value) { return PropertyValue(std::move(value)); }),
        gen::map(gen::arbitrary<PropertyValue::Bytes>(),
                 [](PropertyValue::Bytes value) { return PropertyValue(std::move(value)); }));
}

rc::Gen<PropertyValue> innerValue(int depth) {
    const auto leaf = gen::weightedOneOf<PropertyValue>({{1, gen::just(PropertyValue())}, {5, scalar()}});
    if (depth == 0)
        return leaf;
    const auto members = gen::resize(4, gen::container<std::map<std::string, PropertyValue>>(
                                            fullRange(text()), fullRange(innerValue(depth - 1))));
    return gen::weightedOneOf<PropertyValue>(
        {{4, leaf},
         {1, gen::map(upTo(4, innerValue(depth - 1)),
                      [](PropertyValue::Array value) { return PropertyValue(std::move(value)); })},
         {1, gen::map(members, [](const std::map<std::string, PropertyValue> &value) {
              return PropertyValue(PropertyValue::Dictionary(value.begin(), value.end()));
          })}});
}

rc::Gen<std::uint64_t> anyTimestamp() {
    return gen::oneOf(gen::inRange<std::uint64_t>(0, 20), gen::arbitrary<std::uint64_t>());
}

rc::Gen<std::string> tunableKey() {
    return gen::map(
        gen::oneOf(
            gen::element<std::string>("EnableHoldSuppression", "EnableTapSuppression",
                                      "HoldTimeoutMilliseconds", "ActivationThreshold", "ResetEventStats",
                                      "VirtualNormalizationFactors.", "Unknown"),
            gen::map(gen::inRange(0, 25),
                     [](int index) { return "VirtualNormalizationFactors." + std::to_string(index); }),
            gen::map(gen::inRange(0, 25),
                     [](int index) { return "VirtualNormalizationFactors.0" + std::to_string(index); })),
        [](const std::string &key) { return "Algs." + key; });
}

rc::Gen<PropertyValue> tunableValue() {
    return gen::oneOf(gen::map(gen::inRange<std::uint64_t>(0, 1000),
                               [](std::uint64_t value) { return PropertyValue(value); }),
                      gen::map(gen::inRange(1, 4000), [](int value) { return PropertyValue(value / 8.0); }),
                      scalar());
}

/// Adds a finger's share to the electrode, where there is one.
void press(Electrodes &signals, int electrode, int counts) {
    if (electrode >= 0 && electrode < static_cast<int>(kElectrodeCount))
        signals[static_cast<std::size_t>(electrode)] = static_cast<std::int16_t>(counts);
}

Electrodes fingerAt(const FingerVisit &visit, int frame) {
    const bool isEdge = frame == 0 || frame == visit.frames - 1;
    const int counts = isEdge ? visit.counts * 2 / 3 : visit.counts;
    const int centre =
        (visit.electrode + (visit.drift > 0 ? frame / visit.drift : 0)) % static_cast<int>(kElectrodeCount);
    Electrodes signals{};
    press(signals, centre, counts);
    press(signals, centre - 1, counts * visit.neighbourShare / 100);
    press(signals, centre + 1, counts * visit.neighbourShare / 100);
    return signals;
}

} // namespace

void showValue(const SensorFrame &frame, std::ostream &os) {
    os << frame.timeMs << " ms:";
    for (const std::int16_t counts : frame.signals)
        os << ' ' << counts;
}

void showValue(const FingerVisit &visit, std::ostream &os) {
    os << "{electrode " << visit.electrode << ", counts " << visit.counts << ", neighbours "
       << visit.neighbourShare << " %, frames " << visit.frames << ", drift " << visit.drift << ", gap "
       << visit.gapFrames << ", interval " << visit.intervalMs << " ms}";
}

void showValue(const KeyWrite &write, std::ostream &os) {
    os << write.key << " = " << Util::jsonText(write.value);
}

rc::Gen<std::vector<FingerVisit>> fingerVisits() {
    return upTo(12, gen::build<FingerVisit>(
                        gen::set(&FingerVisit::electrode, gen::inRange(0, 15)),
                        gen::set(&FingerVisit::counts, gen::inRange(60, 700)),
                        gen::set(&FingerVisit::neighbourShare, gen::inRange(0, 90)),
                        gen::set(&FingerVisit::frames, gen::oneOf(gen::inRange(1, 10), gen::inRange(20, 90))),
                        gen::set(&FingerVisit::drift, gen::oneOf(gen::just(0), gen::inRange(1, 40))),
                        gen::set(&FingerVisit::gapFrames, gen::inRange(0, 6)),
                        gen::set(&FingerVisit::intervalMs, gen::inRange(1, 40))));
}

std::vector<SensorFrame> framesOf(const std::vector<FingerVisit> &visits) {
    std::vector<SensorFrame> frames;
    std::uint32_t timeMs = 1000;
    for (const FingerVisit &visit : visits) {
        for (int i = 0; i < visit.frames + visit.gapFrames; ++i) {
            frames.push_back({timeMs, i < visit.frames ? fingerAt(visit, i) : Electrodes{}});
            timeMs += static_cast<std::uint32_t>(visit.intervalMs);
        }
    }
    frames.push_back({timeMs, {}});
    frames.push_back({timeMs + 10, {}});
    return frames;
}

rc::Gen<std::vector<SensorFrame>> anySensorFrames() {
    const auto frame =
        gen::build<SensorFrame>(gen::set(&SensorFrame::timeMs, anyTimeStep()),
                                gen::set(&SensorFrame::signals, gen::container<Electrodes>(anyCounts())));
    return gen::map(upTo(100, frame), [](std::vector<SensorFrame> frames) {
        std::uint32_t timeMs = 0;
        for (SensorFrame &each : frames)
            each.timeMs = timeMs += each.timeMs; // steps become times; they may wrap
        return frames;
    });
}

rc::Gen<KeyWrite> keyWrite() {
    return gen::build<KeyWrite>(gen::set(&KeyWrite::key, tunableKey()),
                                gen::set(&KeyWrite::value, tunableValue()));
}

rc::Gen<std::string> text() {
    return gen::map(upTo(12, anyCodePoint()), [](const std::vector<std::uint32_t> &codes) {
        std::string result;
        for (const std::uint32_t code : codes)
            result += utf8FromCodePoint(code);
        return result;
    });
}

rc::Gen<PropertyValue> jsonValue() {
    return gen::suchThat(innerValue(2), [](const PropertyValue &value) { return !value.isNull(); });
}

rc::Gen<std::vector<Frame>> anyFrames() {
    const auto named = [](FrameType type) {
        return gen::build<Frame>(gen::set(&Frame::type, gen::just(type)),
                                 gen::set(&Frame::timestampNs, anyTimestamp()), gen::set(&Frame::key, text()),
                                 gen::set(&Frame::value, jsonValue()));
    };
    const auto report =
        gen::build<Frame>(gen::set(&Frame::type, gen::just(FrameType::InputReport)),
                          gen::set(&Frame::timestampNs, anyTimestamp()), gen::set(&Frame::data, anyReport()));
    return upTo(30, gen::oneOf(named(FrameType::State), named(FrameType::Metadata), report));
}

rc::Gen<Frame> crowdedFrame() {
    const auto time = gen::inRange<std::uint64_t>(0, 20);
    const auto small =
        gen::map(gen::inRange<std::uint64_t>(0, 5), [](std::uint64_t value) { return PropertyValue(value); });
    const auto state = gen::build<Frame>(
        gen::set(&Frame::type, gen::just(FrameType::State)), gen::set(&Frame::timestampNs, time),
        gen::set(&Frame::key, gen::element<std::string>("a", "b", "c", "d")), gen::set(&Frame::value, small));
    const auto metadata = gen::build<Frame>(
        gen::set(&Frame::type, gen::just(FrameType::Metadata)), gen::set(&Frame::timestampNs, time),
        gen::set(&Frame::key, gen::element<std::string>("a", "m")), gen::set(&Frame::value, small));
    const auto report =
        gen::build<Frame>(gen::set(&Frame::type, gen::just(FrameType::InputReport)),
                          gen::set(&Frame::timestampNs, time), gen::set(&Frame::data, anyReport()));
    return gen::weightedOneOf<Frame>({{4, state}, {1, metadata}, {3, report}});
}

} // namespace Scripted
} // namespace ZorvaTouch

#include "Fuzz/ShortRecording.h"

#include "Fuzz/Transcript.h"
#include "Shared/InputReport.h"

#include <algorithm>
#include <array>
#include <bit>
#include <utility>

namespace ZorvaTouch::Fuzzing {
namespace {

/// Each tunable, what resets and what cannot be written, and the first and the last of the factors with one
/// beyond.
constexpr std::array<std::string_view, 10> kKeys{"Algs.EnableHoldSuppression",
                                                 "Algs.EnableTapSuppression",
                                                 "Algs.HoldTimeoutMilliseconds",
                                                 "Algs.ActivationThreshold",
                                                 "Algs.ResetEventStats",
                                                 "Algs.EventStats",
                                                 "Algs.VirtualNormalizationFactors.0",
                                                 "Algs.VirtualNormalizationFactors.22",
                                                 "Algs.VirtualNormalizationFactors.23",
                                                 "DebugInfo"};
constexpr std::string_view kDomain = "Algs.";
constexpr std::uint8_t kKeyIsText = 0x80;
constexpr std::uint8_t kKeyHasDomain = 0x40;
constexpr std::size_t kLongestText = 31;

enum Kind : std::uint8_t { kImage, kReport, kState, kMetadata };

constexpr std::uint64_t kTimeUnitNs = 8'000'000;
constexpr std::uint64_t kMostTimeUnits = 63;
constexpr std::uint64_t kBoundMask = 15;
constexpr std::uint8_t kClockWrapsSoon = 0x80;
constexpr std::uint32_t kWrapLeadMs = 300;
constexpr std::uint16_t kImageIsLost = 0x8000;

void putNumber(std::string &bytes, std::uint64_t number, std::size_t count) {
    for (std::size_t i = 0; i < count; ++i, number >>= 8)
        bytes.push_back(static_cast<char>(number & 0xFF));
}

void putText(std::string &bytes, std::string_view text) {
    const std::string_view cut = text.substr(0, kLongestText);
    putNumber(bytes, cut.size(), 1);
    bytes.append(cut);
}

void putKey(std::string &bytes, std::string_view key) {
    const auto *const known = std::find(kKeys.begin(), kKeys.end(), key);
    if (known != kKeys.end())
        return putNumber(bytes, static_cast<std::uint64_t>(known - kKeys.begin()), 1);
    const bool hasDomain = key.starts_with(kDomain);
    const std::string_view text = key.substr(hasDomain ? kDomain.size() : 0, kLongestText);
    putNumber(bytes, kKeyIsText | (hasDomain ? kKeyHasDomain : 0) | text.size(), 1);
    bytes.append(text);
}

/// Kinds that do not occur in the seeds' state writes become null.
void putValue(std::string &bytes, const PropertyValue &value) {
    const PropertyValue::Kind kind = value.kind();
    putNumber(bytes, static_cast<std::uint64_t>(kind), 1);
    if (const bool *const boolean = value.asBool())
        putNumber(bytes, *boolean ? 1 : 0, 1);
    else if (const std::uint64_t *const number = value.asUnsigned())
        putNumber(bytes, *number, 8);
    else if (const double *const real = value.asDouble())
        putNumber(bytes, std::bit_cast<std::uint64_t>(*real), 8);
    else if (const std::string *const text = value.asString())
        putText(bytes, *text);
    else
        bytes.back() = 0;
}

/// Images: the next one is written as the difference from the time and number of the last.
class Writer {
public:
    explicit Writer(std::uint32_t firstTimeMs) {
        const bool wrapsSoon = firstTimeMs >= 0U - kWrapLeadMs;
        putNumber(_bytes, wrapsSoon ? kClockWrapsSoon : 0, 1);
        _timeMs = wrapsSoon ? 0U - kWrapLeadMs : 0;
    }

    /// @param untilNextNs  From this frame to the next.
    void put(const FrameView &frame, std::uint64_t untilNextNs) {
        const std::uint64_t time = std::min(untilNextNs / kTimeUnitNs, kMostTimeUnits) << 2;
        if (frame.type != FrameType::InputReport) {
            putNumber(_bytes, time | (frame.type == FrameType::State ? kState : kMetadata), 1);
            putKey(_bytes, frame.key);
            return putValue(_bytes, frame.value);
        }
        if (const auto image = InputReport::Image::parse(frame.data.data(), frame.data.size())) {
            putNumber(_bytes, time | kImage, 1);
            return putImage(*image);
        }
        putNumber(_bytes, time | kReport, 1);
        putText(_bytes, {reinterpret_cast<const char *>(frame.data.data()), frame.data.size()});
    }

    [[nodiscard]] std::string take() { return std::move(_bytes); }

private:
    void putImage(const InputReport::Image &image) {
        putNumber(_bytes, image.timeMs - _timeMs, 2);
        _timeMs = image.timeMs;
        std::uint16_t mask = image.frameNumber != ++_frameNumber ? kImageIsLost : 0;
        _frameNumber = image.frameNumber;
        for (std::size_t i = 0; i < kElectrodeCount; ++i)
            if (image.signals[i] != 0)
                mask = static_cast<std::uint16_t>(mask | 1U << i);
        putNumber(_bytes, mask, 2);
        for (const std::int16_t signal : image.signals)
            if (signal != 0)
                putNumber(_bytes, static_cast<std::uint16_t>(signal), 2);
    }

    std::string _bytes;
    std::uint32_t _timeMs = 0;
    std::uint32_t _frameNumber = 0;
};

std::uint32_t firstTimeMs(const FrameList &frames) {
    for (const FrameView &frame : frames)
        if (const auto image = InputReport::Image::parse(frame.data.data(), frame.data.size()))
            return image->timeMs;
    return 0;
}

} // namespace

ShortRecordingReader::ShortRecordingReader(std::span<const std::uint8_t> input) noexcept
    : _input(input), _timestampNs(kStartTicks) {
    const std::uint64_t head = takeNumber(1);
    _bound = head & kBoundMask;
    _timeMs = (head & kClockWrapsSoon) != 0 ? 0U - kWrapLeadMs : 0;
}

std::optional<Frame> ShortRecordingReader::next() {
    if (_input.empty())
        return std::nullopt;
    const std::uint64_t head = takeNumber(1);
    Frame frame{FrameType::InputReport, _timestampNs, {}, {}, {}};
    _timestampNs += (head >> 2) * kTimeUnitNs;
    switch (static_cast<Kind>(head & 3)) {
    case kImage:
        frame.data = takeImage();
        break;
    case kReport: {
        const auto report = takeBytes(takeNumber(1));
        frame.data.assign(report.begin(), report.end());
        break;
    }
    case kState:
    case kMetadata:
        frame.type = (head & 3) == kState ? FrameType::State : FrameType::Metadata;
        frame.key = takeKey();
        frame.value = takeValue();
        break;
    }
    return frame;
}

std::uint64_t ShortRecordingReader::takeNumber(std::size_t bytes) noexcept {
    std::uint64_t number = 0;
    const auto taken = takeBytes(bytes);
    for (std::size_t i = taken.size(); i-- > 0;)
        number = number << 8 | taken[i];
    return number;
}

std::span<const std::uint8_t> ShortRecordingReader::takeBytes(std::size_t count) noexcept {
    const auto taken = _input.first(std::min(count, _input.size()));
    _input = _input.subspan(taken.size());
    return taken;
}

std::string ShortRecordingReader::takeText(std::size_t length) {
    const auto text = takeBytes(length);
    return {text.begin(), text.end()};
}

std::vector<std::uint8_t> ShortRecordingReader::takeImage() {
    InputReport::Image image{};
    _timeMs += static_cast<std::uint32_t>(takeNumber(2));
    const std::uint64_t mask = takeNumber(2);
    _frameNumber += (mask & kImageIsLost) != 0 ? 2 : 1;
    image.timeMs = _timeMs;
    image.frameNumber = _frameNumber;
    for (std::size_t i = 0; i < kElectrodeCount; ++i)
        if ((mask >> i & 1) != 0)
            image.signals[i] = static_cast<std::int16_t>(takeNumber(2));
    const auto report = image.toReport();
    return {report.begin(), report.end()};
}

std::string ShortRecordingReader::takeKey() {
    const auto head = static_cast<std::uint8_t>(takeNumber(1));
    if ((head & kKeyIsText) == 0)
        return std::string(kKeys[head % kKeys.size()]);
    return std::string((head & kKeyHasDomain) != 0 ? kDomain : "") + takeText(head & kLongestText);
}

PropertyValue ShortRecordingReader::takeValue() {
    const std::uint64_t kind = takeNumber(1);
    switch (static_cast<PropertyValue::Kind>(kind)) {
    case PropertyValue::Kind::Boolean:
        return takeNumber(1) != 0;
    case PropertyValue::Kind::Unsigned:
        return takeNumber(8);
    case PropertyValue::Kind::Double:
        return std::bit_cast<double>(takeNumber(8));
    case PropertyValue::Kind::String:
        return takeText(takeNumber(1) & kLongestText);
    case PropertyValue::Kind::Bytes: {
        const auto bytes = takeBytes(takeNumber(1) & kLongestText);
        return PropertyValue::Bytes(bytes.begin(), bytes.end());
    }
    case PropertyValue::Kind::Array:
        return PropertyValue::Array{std::bit_cast<float>(static_cast<std::uint32_t>(takeNumber(4))), "x"};
    case PropertyValue::Kind::Dictionary:
        return PropertyValue::Dictionary{{takeText(takeNumber(1) & kLongestText), takeNumber(8)}};
    default:
        return {};
    }
}

std::string shortRecording(const FrameList &frames) {
    Writer writer(firstTimeMs(frames));
    for (std::size_t i = 0; i < frames.size(); ++i) {
        const std::uint64_t now = frames[i].timestampNs;
        writer.put(frames[i], (i + 1 < frames.size() ? frames[i + 1].timestampNs : now) - now);
    }
    return writer.take();
}

} // namespace ZorvaTouch::Fuzzing
